// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "core/Handles.h"

#include <curl/curl.h>

namespace NQRVZEP20 {

// What is logged when libcurl cannot be had, each message as a whole; behind the first two stands the loader's reason.
struct TCurlMessages {
  char const* fNotOpened;
  char const* fFunctionMissing;
  char const* fNotInitialised;
  char const* fErrorBuffer;
};

// One transfer by libcurl, which is loaded for it (and never linked), and unloaded with it: the handle is cleaned up, then
// libcurl itself, then the library is closed. Of libcurl's global state there is one per process: no two of these at once.
class TCurl {
public:
  // Loads the first libcurl that can be had, beside the core library or by the loader's search, and sets the error buffer.
  // A failure is logged as an error and throws kZEPStatusLibCurlFailure.
  explicit TCurl(TCurlMessages const& messages);

  // Numbers are to be `long`, texts are copied by libcurl. A failure is logged as an error with that message and throws
  // kZEPStatusLibCurlFailure.
  template <class TValue>
  void Set(CURLoption option, TValue value, char const* message) {
    if (fFunctions.setOption(fHandle.get(), option, value) != CURLE_OK) Fail(message);
  }

  CURLcode Perform() { return fFunctions.perform(fHandle.get()); }

  // What libcurl said of a failing Perform; may be empty.
  char const* ErrorText() const { return fErrorText; }

private:
  struct TFunctions {
    decltype(curl_global_init)* globalInit;
    decltype(curl_easy_init)* init;
    decltype(curl_easy_setopt)* setOption;
    decltype(curl_easy_perform)* perform;
    decltype(curl_easy_cleanup)* cleanup;
    decltype(curl_global_cleanup)* globalCleanup;
  };
  struct TGlobalState {
    explicit TGlobalState(TFunctions const& functions);
    ~TGlobalState() { fCleanup(); }
    decltype(curl_global_cleanup)* fCleanup;
  };

  static TSharedLibrary Open(char const* message);
  static TFunctions FunctionsOf(void* library, char const* message);
  [[noreturn]] static void Fail(char const* message);

  // In the order in which they are made; they are released the other way round.
  TSharedLibrary const fLibrary;
  TFunctions const fFunctions;
  TGlobalState const fGlobalState;
  char fErrorText[CURL_ERROR_SIZE] = "";  // libcurl does not always fill it
  std::unique_ptr<CURL, decltype(curl_easy_cleanup)*> const fHandle;
};

}  // namespace NQRVZEP20
