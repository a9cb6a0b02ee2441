// SPDX-License-Identifier: Apache-2.0
#include "loaders/CurlLibrary.h"

#include "TOSSpecific.h"
#include "core/Failure.h"

namespace NQRVZEP20 {
namespace {

// The reason that the exception carries follows the operation's name in the message.
[[noreturn]] void Throw(std::string_view message, std::string const& detail) {
  std::size_t const reason = message.find(": ") + 2;
  LogErrorAndThrow(kZEPStatusLibCurlFailure, message.substr(0, reason), std::string(message.substr(reason)) + detail);
}

// Ends the search at the first function that is missing, of which the linker tells.
template <class TFunction>
TFunction* FunctionOrThrow(void* library, char const* name, char const* message) {
  TFunction* const function = FunctionOf<TFunction>(library, name);
  if (function == nullptr) Throw(message, LinkerReason());
  return function;
}

}  // namespace

TCurl::TCurl(TCurlMessages const& messages)
    : fLibrary(Open(messages.fNotOpened)),
      fFunctions(FunctionsOf(fLibrary.get(), messages.fFunctionMissing)),
      fGlobalState(fFunctions),
      fHandle(fFunctions.init(), fFunctions.cleanup) {
  if (!fHandle) Fail(messages.fNotInitialised);
  Set(CURLOPT_ERRORBUFFER, fErrorText, messages.fErrorBuffer);
}

TSharedLibrary TCurl::Open(char const* message) {
  std::string const root = TOSSpecific::GetZEPRootPath();
  for (std::string const& name : {root + "/libcurl.so", root + "/libcurl.so.4", std::string("libcurl.so"),
                                  std::string("libcurl.so.4"), std::string("libcurl.so.3"), std::string("libcurl.so.2")})
    if (TSharedLibrary library{::dlopen(name.c_str(), RTLD_LAZY)}) return library;
  Throw(message, LinkerReason());
}

TCurl::TFunctions TCurl::FunctionsOf(void* library, char const* message) {
  return {FunctionOrThrow<decltype(curl_global_init)>(library, "curl_global_init", message),
          FunctionOrThrow<decltype(curl_easy_init)>(library, "curl_easy_init", message),
          FunctionOrThrow<decltype(curl_easy_setopt)>(library, "curl_easy_setopt", message),
          FunctionOrThrow<decltype(curl_easy_perform)>(library, "curl_easy_perform", message),
          FunctionOrThrow<decltype(curl_easy_cleanup)>(library, "curl_easy_cleanup", message),
          FunctionOrThrow<decltype(curl_global_cleanup)>(library, "curl_global_cleanup", message)};
}

// Its result is not asked for: without it no handle is to be had either.
TCurl::TGlobalState::TGlobalState(TFunctions const& functions) : fCleanup(functions.globalCleanup) {
  functions.globalInit(CURL_GLOBAL_ALL);
}

void TCurl::Fail(char const* message) { Throw(message, ""); }

}  // namespace NQRVZEP20
