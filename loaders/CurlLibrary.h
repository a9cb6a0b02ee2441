// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "loaders/TLoadedLibrary.h"

// Transfers are limited to one protocol by options that every version of libcurl supports, although newer versions deprecate
// them.
#define CURL_DISABLE_DEPRECATION
#include <curl/curl.h>

#include <memory>
#include <vector>

namespace NQRVZEP20 {

// The functions of libcurl that every transfer uses. libcurl is loaded at run time, never linked: the first one that can be
// loaded, from the directory of the core library or on the dynamic linker's search path.
struct TCurlFunctions {
  decltype(curl_global_init)* fGlobalInit = nullptr;
  decltype(curl_easy_init)* fInit = nullptr;
  decltype(curl_easy_setopt)* fSetOption = nullptr;
  decltype(curl_easy_perform)* fPerform = nullptr;
  decltype(curl_easy_cleanup)* fCleanup = nullptr;
  decltype(curl_global_cleanup)* fGlobalCleanup = nullptr;

  static TLibraryPlace Place();
  std::vector<TLibraryFunction> Table();
};

// Messages logged when libcurl cannot be used. The linker's reason is appended to the first two.
struct TCurlMessages {
  char const* fNotOpened;
  char const* fFunctionMissing;
  char const* fNotInitialised;
  char const* fErrorBuffer;
};

// One transfer with libcurl. The constructor loads libcurl; the destructor cleans up the handle and libcurl's global state, and
// unloads libcurl. The global state belongs to the process: do not use two of these objects at once.
class TCurl {
public:
  // Loads libcurl and sets the error buffer. A failure is logged as an error and throws TZEPFailure with
  // kZEPStatusLibCurlFailure.
  explicit TCurl(TCurlMessages const& messages);

  // Numbers must be `long`; strings are copied by libcurl. A failure is logged as an error with that message and throws
  // TZEPFailure with kZEPStatusLibCurlFailure.
  template <class TValue>
  void Set(CURLoption option, TValue value, char const* message) {
    if (fLibrary->fSetOption(fHandle.get(), option, value) != CURLE_OK) Fail(message);
  }

  CURLcode Perform() { return fLibrary->fPerform(fHandle.get()); }

  // libcurl's error message after Perform has failed; may be empty.
  char const* ErrorText() const { return fErrorText; }

private:
  struct TGlobalState {
    explicit TGlobalState(TCurlFunctions const& functions);
    ~TGlobalState() { fCleanup(); }
    decltype(curl_global_cleanup)* fCleanup;
  };

  static TCurlFunctions const& Checked(TLoadedLibrary<TCurlFunctions> const& library, TCurlMessages const& messages);
  [[noreturn]] static void Fail(char const* message);

  // Constructed in this order and destroyed in reverse order.
  TLoadedLibrary<TCurlFunctions> const fLibrary;
  TGlobalState const fGlobalState;
  char fErrorText[CURL_ERROR_SIZE] = "";  // libcurl does not always set it
  std::unique_ptr<CURL, decltype(curl_easy_cleanup)*> const fHandle;
};

}  // namespace NQRVZEP20
