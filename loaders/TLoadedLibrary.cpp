// SPDX-License-Identifier: Apache-2.0
#include "loaders/TLoadedLibrary.h"

namespace NQRVZEP20 {
namespace {

TSharedLibrary FirstOf(TLibraryPlace const& place) {
  for (std::string const& name : place.fNames)
    if (TSharedLibrary library{::dlopen(name.c_str(), place.fMode)}) return library;
  return nullptr;
}

}  // namespace

TSharedLibrary OpenLibrary(TLibraryPlace const& place, std::vector<TLibraryFunction> const& table, TLoadOutcome& outcome) {
  TSharedLibrary library = FirstOf(place);
  if (!library) {
    outcome = {TLoadOutcome::kNotLoaded, LinkerReason()};
    return nullptr;
  }
  for (TLibraryFunction const& function : table) {
    if (function.FindIn(library.get())) continue;
    outcome = {TLoadOutcome::kFunctionMissing, LinkerReason()};
    return nullptr;
  }
  outcome = {};
  return library;
}

EZEPStatusCode StatusOf(TLoadOutcome const& outcome) {
  switch (outcome.fKind) {
    case TLoadOutcome::kComplete:
      return kZEPStatusOK;
    case TLoadOutcome::kNotLoaded:
      return kZEPStatusFileSystemError;
    case TLoadOutcome::kFunctionMissing:
      return kZEPStatusNotFound;
  }
  return kZEPStatusFail;
}

}  // namespace NQRVZEP20
