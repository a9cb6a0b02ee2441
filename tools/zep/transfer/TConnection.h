// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "loaders/CurlLibrary.h"

#include <array>
#include <cstdint>
#include <string>
#include <vector>

namespace NQRVZEP20::zep {

using TCommands = std::vector<std::string>;

// The functions of libcurl that a connection uses.
struct TConnectionFunctions : TCurlFunctions {
  decltype(curl_easy_getinfo)* fGetInfo = nullptr;
  decltype(curl_slist_append)* fAppend = nullptr;
  decltype(curl_slist_free_all)* fFreeAll = nullptr;

  std::vector<TLibraryFunction> Table() {
    std::vector<TLibraryFunction> table = TCurlFunctions::Table();
    table.insert(table.end(),
                 {{"curl_easy_getinfo", fGetInfo}, {"curl_slist_append", fAppend}, {"curl_slist_free_all", fFreeAll}});
    return table;
  }
};

// libcurl, and one connection that successive transfers share. It belongs to one thread.
class TConnection {
public:
  // Throws TZEPFailure with kZEPStatusLibCurlFailure when libcurl cannot be used.
  TConnection();
  ~TConnection();
  TConnection(TConnection const&) = delete;
  TConnection& operator=(TConnection const&) = delete;

  template <class TValue>
  void Set(CURLoption option, TValue value) {
    fCurl->fSetOption(fHandle, option, value);
  }

  // The commands that the server executes after the next transfers.
  void SetCommandsAfter(TCommands const& commands);

  // Blocks until the transfer has ended.
  CURLcode Perform(std::string const& url);

  // When the remote file of the last transfer was changed last, in seconds since 1970; -1 when the server does not report it.
  std::int64_t RemoteTime() const;

  // The size of what the last transfer fetches, in bytes; -1 when the server does not report it. 0 also when it fetches nothing.
  std::int64_t BytesToCome() const;

  // Whether the connection of the last transfer has ended.
  bool IsLost() const;

  // Why the last transfer failed; may be empty. It is empty when no connection to the server could be made: WhyUnreachable finds
  // that reason.
  std::string ErrorText() const;

  // Throws the TZEPFailure for a failed transfer.
  [[noreturn]] static void FailFor(CURLcode code, std::string const& errorText);

private:
  bool IsDataPortNamed() const;

  TLoadedLibrary<TConnectionFunctions> const fCurl;
  CURL* fHandle = nullptr;
  std::vector<curl_slist*> fLists;
  std::array<char, CURL_ERROR_SIZE> fError{};  // libcurl's text for the last transfer
  CURLcode fCode = CURLE_OK;                   // its result
};

}  // namespace NQRVZEP20::zep
