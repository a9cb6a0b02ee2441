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

// libcurl, and a connection that successive transfers share. Use it from one thread only.
class TConnection {
public:
  // Throws TZEPFailure with kZEPStatusLibCurlFailure if libcurl cannot be loaded or initialised.
  TConnection();
  ~TConnection();
  TConnection(TConnection const&) = delete;
  TConnection& operator=(TConnection const&) = delete;

  template <class TValue>
  void Set(CURLoption option, TValue value) {
    fCurl->fSetOption(fHandle, option, value);
  }

  // Sets the commands that are sent to the server after each of the following transfers.
  void SetCommandsAfter(TCommands const& commands);

  // Performs a transfer and blocks until it has ended.
  CURLcode Perform(std::string const& url);

  // The modification time of the last transfer's remote file, in seconds since 1970; -1 if the server does not report it.
  std::int64_t RemoteTime() const;

  // The number of bytes that the last transfer downloads; -1 if the server does not report it. Also 0 for a transfer without a
  // download.
  std::int64_t BytesToCome() const;

  // Whether the connection of the last transfer has been closed.
  bool IsLost() const;

  // Why the last transfer failed; may be empty. It is always empty if no connection to the server could be made; WhyUnreachable
  // finds the reason for that.
  std::string ErrorText() const;

  // Throws the TZEPFailure that reports this result of a transfer.
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
