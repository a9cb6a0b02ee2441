// SPDX-License-Identifier: Apache-2.0
#pragma once

namespace NQRVZEP20 {

// What a plug-in is doing.
enum class EStage : unsigned char {
  kOpen,          // its file is opened, and its symbols are resolved
  kConstruction,  // its static objects are constructed
  kRegistration,  // its provider is registered
  kFill           // a namespace is filled and written
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
