// SPDX-License-Identifier: Apache-2.0

// The rule of a check that compares the namespaces of two processes. The classes, the instances, and the types must be the same;
// a value that is not a key may change, as the load of a processor does.

#include "CIMNames.h"
#include "tools/zep/output/Json.h"
#include "tools/zep/output/Text.h"
#include "tools/zep/plugin/check/Rules.h"
#include "tools/zep/secrets/Secrets.h"

#include <algorithm>
#include <map>
#include <set>

namespace NQRVZEP20::zep {

namespace {

constexpr char kRemedy[] = "describe the same machine in the same way each time: no counters, times or process ids in keys";

// Pairs up the elements of two lists by the text that `keyOf` returns. Calls `both` for each pair, and reports elements without a
// counterpart. Of several elements with the same text, the last one counts.
template <class TElement, class TKeyOf, class TBoth>
void Compare(std::vector<TElement> const& first, std::vector<TElement> const& second, TKeyOf keyOf, TBoth both,
             std::string const& prefix, TRuleResult& result) {
  std::map<std::string, TElement const*> others;
  for (TElement const& element : second) others[keyOf(element)] = &element;
  std::set<std::string> known;
  for (TElement const& element : first) {
    std::string const key = keyOf(element);
    known.insert(key);
    auto const other = others.find(key);
    if (other == others.end())
      result.Find(prefix + key, "it is missing the second time", kRemedy);
    else
      both(element, *other->second);
  }
  for (auto const& [key, element] : others)
    if (known.count(key) == 0) result.Find(prefix + key, "it is missing the first time", kRemedy);
}

std::string DescriptionOf(TDeclaration const& declaration) {
  return NameOf(declaration.fType) + (declaration.fIsKey ? ", key" : "");
}

std::string TextOf(TCIMValue const& value) { return value.IsNull() ? "NULL" : value.ToString(); }

void CompareClasses(TClassContent const& first, TClassContent const& second, TRuleResult& result) {
  if (Joined(first.fSuperClasses, " ") != Joined(second.fSuperClasses, " "))
    result.Find(first.fName, "its superclasses are others the second time", kRemedy);
  Compare(
      first.fDeclarations, second.fDeclarations, [](TDeclaration const& declaration) { return FoldName(declaration.fName); },
      [&](TDeclaration const& one, TDeclaration const& other) {
        if (DescriptionOf(one) != DescriptionOf(other))
          result.Find(first.fName + "." + one.fName,
                      "its type is " + DescriptionOf(one) + ", and " + DescriptionOf(other) + " the second time", kRemedy);
      },
      first.fName + ".", result);
}

// Adds the properties whose values are not the same to `changed`.
void CompareInstances(TInstanceContent const& first, TInstanceContent const& second, std::set<std::string>& changed,
                      TRuleResult& result) {
  Compare(
      first.fProperties, second.fProperties, [](TPropertyContent const& property) { return property.fName; },
      [&](TPropertyContent const& one, TPropertyContent const& other) {
        if (one.fValue.GetType() != other.fValue.GetType())
          result.Find(first.fPath + "." + one.fName, "its type is another one the second time", kRemedy);
        else if (TextOf(one.fValue) != TextOf(other.fValue))
          changed.insert(first.fClass + "." + one.fName);
      },
      first.fPath + ".", result);
}

void CompareContents(TContent const& first, TContent const& second, TRuleResult& result) {
  Compare(
      first.fClasses, second.fClasses, [](TClassContent const& cls) { return cls.fName; },
      [&](TClassContent const& one, TClassContent const& other) { CompareClasses(one, other, result); }, "class ", result);
  std::set<std::string> changed;
  Compare(
      first.fInstances, second.fInstances, [](TInstanceContent const& instance) { return instance.fPath; },
      [&](TInstanceContent const& one, TInstanceContent const& other) { CompareInstances(one, other, changed, result); }, "",
      result);
  for (std::string const& property : changed) result.Note(property, "its value changed between the two fills");
}

// Why the provider did not fill its namespace.
std::string FailureOf(std::string const& provider, TPlugIn const& plugIn) {
  for (TProviderRun const& run : plugIn.fProviders)
    if (run.fName == provider && !run.fError.empty()) return run.fError;
  return plugIn.fError.empty() ? "it was not registered" : plugIn.fError;
}

}  // namespace

void CheckFillDiffers(TObservation const& observation, TRuleResult& result) {
  if (!observation.WhyNoContent().empty()) return result.CannotCheck(observation.WhyNoContent());
  std::vector<TContent> const& others = observation.fSecond.fContents;
  for (TContent const& content : observation.fFirst.fContents) {
    auto const isSame = [&](TContent const& other) { return other.fProvider == content.fProvider; };
    auto const other = std::find_if(others.begin(), others.end(), isSame);
    if (other != others.end())
      CompareContents(content, *other, result);
    else
      result.Find(
          "provider " + content.fProvider,
          "it failed the second time: " + MessageWithoutSecrets(FailureOf(content.fProvider, observation.fSecond.fPlugIn)));
  }
}

}  // namespace NQRVZEP20::zep
