// SPDX-License-Identifier: Apache-2.0
#pragma once

namespace NQRVZEP20 {

// The stages in the life of a plug-in.
enum class EStage : unsigned char {
  kOpen,          // its file is opened and its symbols are resolved
  kConstruction,  // its static objects are constructed
  kRegistration,  // a provider registers itself
  kFill           // a namespace is filled and serialised
};

inline char const* NameOf(EStage stage) {
  switch (stage) {
    case EStage::kOpen:
      return "open";
    case EStage::kConstruction:
      return "static construction";
    case EStage::kRegistration:
      return "registration";
    default:
      return "fill";
  }
}

}  // namespace NQRVZEP20
