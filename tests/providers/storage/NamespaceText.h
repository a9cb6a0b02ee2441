// SPDX-License-Identifier: Apache-2.0
#pragma once

// A namespace as text, for comparisons of everything that it contains.

#include "MissingValueClass.h"
#include "TReasonReader.h"
#include "tests/providers/memory/Collect.h"

#include <regex>
#include <string>

namespace NQRVZEP20 {

// An object path without the keys that name the class and the system.
inline std::string ShortPath(std::string const& path) {
  static std::regex const noise("(CreationClassName|SystemCreationClassName|SystemName|CSCreationClassName|CSName)=\"[^\"]*\",?");
  static std::regex const comma(",(?=\"|$)");
  return std::regex_replace(std::regex_replace(path, noise, ""), comma, "");
}

// Two lines or more for each instance: its short path, and for each other property "  Name = value" or "  Name: reason".
inline std::string TextOf(ICIMNamespace const& ns) {
  std::string text;
  TReasonReader const reasons(ns);
  for (auto const& root : All(ns, &ICIMNamespace::EnumerateClasses))
    for (auto const& instance : All(*root, &ICIMClass::EnumerateInstances)) {
      if (instance->GetClass(kNone)->GetName(kNone) == kMissingValueClass) continue;
      text += ShortPath(instance->GetPath(kNone).GetPath()) + "\n";
      for (auto const& property : All(*instance, &ICIMInstance::EnumerateProperties)) {
        std::string const name = property->GetName(kNone);
        if (instance->GetClass(kNone)->GetPropertyDecl(name, kNone)->IsKey(kNone)) continue;
        TCIMValue const value = property->GetValue(kNone);
        auto const why = reasons.WhyMissing(*instance, name);
        if (!value.IsNull()) text += "  " + name + " = " + value.ToString() + "\n";
        if (value.IsNull() && why) text += "  " + name + ": " + why->fReason + "\n";
      }
    }
  return text;
}

}  // namespace NQRVZEP20
