// SPDX-License-Identifier: Apache-2.0
#pragma once

// The complete instances of a namespace as text, for comparison with an expected one.

#include "MissingValueClass.h"
#include "tests/providers/memory/Collect.h"

#include "providers/reasons/TReasonReader.h"

namespace NQRVZEP20 {

// For each instance its path, and below it a line for each property that is not a key: "  Speed = 1000000000", or
// "  Speed: the reason why it is missing". Below the name of a class, the reason why it has no or not every instance.
inline std::string InstancesText(ICIMNamespace const& ns) {
  TReasonReader const reasons(ns);
  std::string text;
  auto const addProperties = [&](ICIMInstance const& instance, ICIMClass const& cls) {
    for (auto const& property : All(instance, &ICIMInstance::EnumerateProperties)) {
      std::string const name = property->GetName(kNone);
      if (cls.GetPropertyDecl(name, kNone)->IsKey(kNone)) continue;
      TCIMValue const value = property->GetValue(kNone);
      auto const why = reasons.WhyMissing(instance, name);
      text += "  " + name + (value.IsNull() ? ": " + (why ? why->fReason : "no reason") : " = " + value.ToString()) + "\n";
    }
  };
  auto const addClass = [&](ICIMClass const& cls) {
    std::string const name = cls.GetName(kNone);
    if (name == kMissingValueClass) return;
    if (auto const why = reasons.WhyNoInstance(name)) text += name + ": " + why->fReason + "\n";
    for (auto const& instance : All(cls, &ICIMClass::EnumerateInstances)) {
      if (instance->GetClass(kNone)->GetName(kNone) != name) continue;
      text += instance->GetPath(kNone).GetPath() + "\n";
      addProperties(*instance, cls);
    }
  };
  for (auto const& root : All(ns, &ICIMNamespace::EnumerateClasses)) {
    addClass(*root);
    for (auto const& cls : All(*root, &ICIMClass::EnumerateSubClasses)) addClass(*cls);
  }
  return text;
}

}  // namespace NQRVZEP20
