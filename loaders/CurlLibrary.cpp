// SPDX-License-Identifier: Apache-2.0
#include "loaders/CurlLibrary.h"

#include "TOSSpecific.h"
#include "core/Failure.h"

#include <string_view>

namespace NQRVZEP20 {
namespace {

// The reason that the exception carries follows the operation's name in the message.
[[noreturn]] void Throw(std::string_view message, std::string const& detail) {
  std::size_t const reason = message.find(": ") + 2;
  LogErrorAndThrow(kZEPStatusLibCurlFailure, message.substr(0, reason), std::string(message.substr(reason)) + detail);
}

}  // namespace

TLibraryPlace TCurlFunctions::Place() {
  std::string const root = TOSSpecific::GetZEPRootPath();
  return {{root + "/libcurl.so", root + "/libcurl.so.4", "libcurl.so", "libcurl.so.4", "libcurl.so.3", "libcurl.so.2"},
          RTLD_LAZY};
}

std::vector<TLibraryFunction> TCurlFunctions::Table() {
  return {{"curl_global_init", fGlobalInit}, {"curl_easy_init", fInit},       {"curl_easy_setopt", fSetOption},
          {"curl_easy_perform", fPerform},   {"curl_easy_cleanup", fCleanup}, {"curl_global_cleanup", fGlobalCleanup}};
}

TCurl::TCurl(TCurlMessages const& messages)
    : fGlobalState(Checked(fLibrary, messages)), fHandle(fLibrary->fInit(), fLibrary->fCleanup) {
  if (!fHandle) Fail(messages.fNotInitialised);
  Set(CURLOPT_ERRORBUFFER, fErrorText, messages.fErrorBuffer);
}

TCurlFunctions const& TCurl::Checked(TLoadedLibrary<TCurlFunctions> const& library, TCurlMessages const& messages) {
  TLoadOutcome const& outcome = library.Outcome();
  if (outcome) return *library;
  Throw(outcome.fKind == TLoadOutcome::kNotLoaded ? messages.fNotOpened : messages.fFunctionMissing, outcome.fReason);
}

// The result of the initialisation is not checked: after a failure no handle can be had either.
TCurl::TGlobalState::TGlobalState(TCurlFunctions const& functions) : fCleanup(functions.fGlobalCleanup) {
  functions.fGlobalInit(CURL_GLOBAL_ALL);
}

void TCurl::Fail(char const* message) { Throw(message, ""); }

}  // namespace NQRVZEP20
