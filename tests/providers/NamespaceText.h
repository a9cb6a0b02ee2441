// SPDX-License-Identifier: Apache-2.0
#pragma once

// A provider's namespace as text, to compare all of it with a file.

#include "TReasonReader.h"
#include "tests/providers/memory/Collect.h"

namespace NQRVZEP20 {

// Every instance but those of ZEP_MissingValue: its path, then its properties except the keys, each on a line. A missing value
// is its reason in angle brackets.
inline std::string TextOf(ICIMNamespace const& ns) {
  TReasonReader const reasons(ns);
  auto const valueOf = [&](ICIMInstance const& instance, ICIMProperty const& property) {
    TCIMValue const value = property.GetValue(kNone);
    if (!value.IsNull()) return value.ToString();
    auto const why = reasons.WhyMissing(instance, property.GetName(kNone));
    return why ? "<" + why->fReason + ">" : std::string("<no reason>");
  };

  std::string text;
  for (auto const& root : All(ns, &ICIMNamespace::EnumerateClasses)) {
    if (root->GetName(kNone) == "ZEP_MissingValue") continue;
    for (auto const& instance : All(*root, &ICIMClass::EnumerateInstances)) {
      text += instance->GetPath(kNone).GetPath() + "\n";
      auto const cls = instance->GetClass(kNone);
      for (auto const& property : All(*instance, &ICIMInstance::EnumerateProperties)) {
        std::string const name = property->GetName(kNone);
        if (!cls->GetPropertyDecl(name, kNone)->IsKey(kNone)) text += "  " + name + ": " + valueOf(*instance, *property) + "\n";
      }
    }
  }
  return text;
}

// Expects that the text of the namespace is that of the file. On a failure, the text is written to `file`.actual in the build
// tree, to be compared and, if it is right, to replace the file.
inline void ExpectTextOf(ICIMNamespace const& ns, std::string const& file) {
  std::string const text = TextOf(ns), actual = BuildPath(std::filesystem::path(file).filename().string() + ".actual");
  if (text == ReadFile(SourcePath(file))) return;
  WriteFile(actual, text);
  ADD_FAILURE() << "not the text of " << file << ": see " << actual;
}

}  // namespace NQRVZEP20
