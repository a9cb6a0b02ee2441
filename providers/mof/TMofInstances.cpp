// SPDX-License-Identifier: Apache-2.0
#include "providers/mof/TMofInstances.h"

#include "ICIMClass.h"
#include "ICIMInstance.h"
#include "ICIMProperty.h"
#include "ICIMPropertyDecl.h"
#include "providers/memory/CIMNames.h"
#include "providers/mof/MofRefusal.h"
#include "providers/mof/MofValues.h"
#include "providers/mof/TMofParser.h"

#include <algorithm>
#include <set>

namespace NQRVZEP20 {

namespace {

constexpr std::size_t kMostNestedKeys = 8;  // the text of such a path doubles with each

TCIMContext const kNone;

bool IsAlias(TMofValue const& value) { return !value.fIsArray && value.fLiterals.front().fKind == TMofLiteral::kAlias; }

}  // namespace

void TMofInstances::Build() {
  std::size_t const count = fDocument.fInstances.size();
  for (TMofInstanceText const& instance : fDocument.fInstances)
    Create(TMofParser(*instance.fFile, instance.fKeyword).ParseInstanceHead());
  for (std::size_t number = 0; number < count; ++number) SetPlainValues(number);
  for (std::size_t number = 0; number < count; ++number) SetKeys(number);
  for (std::size_t number = 0; number < count; ++number) Commit(number);
  for (std::size_t number = 0; number < count; ++number) SetAliases(number, false);
}

void TMofInstances::Create(TMofInstance const& instance) {
  auto const cls = AtPlace(instance.fClassName, kZEPStatusNotFound, "is no class that is declared",
                           [&] { return fNamespace->GetClass(NameAt(instance.fClassName), kNone); });
  auto const made = AtPlace(instance.fClassName, kZEPStatusInvalidClass, "is abstract and has no instances",
                            [&] { return cls->CreateInstance(kNone); });
  if (!instance.fAlias.fText.empty() && !fAliases.emplace(FoldName(NameAt(instance.fAlias)), fMade.size()).second)
    throw TMofError(instance.fAlias, NameAt(instance.fAlias) + " is the alias of another instance");
  fMade.push_back({instance.fClassName, cls, made, kNotSet});
}

void TMofInstances::SetPlainValues(std::size_t number) {
  TMofInstanceText const& text = fDocument.fInstances[number];
  TMofInstance const instance = TMofParser(*text.fFile, text.fKeyword).ParseInstance();
  std::set<std::string> seen;
  for (TMofAssignment const& assignment : instance.fValues) {
    if (!seen.insert(FoldName(NameAt(assignment.fName))).second)
      throw TMofError(assignment.fName, NameAt(assignment.fName) + " has a value already");
    auto const property = PropertyOf(number, assignment.fName);
    if (IsAlias(assignment.fValue)) {
      fAliasValues.push_back({number, assignment.fName, assignment.fValue.fPlace});
      continue;
    }
    TCIMValue const pattern = property->GetDeclaration(kNone)->GetDefaultValue(kNone);
    TCIMValue const value = ReadMofValue(assignment.fValue, pattern.GetType(), pattern.GetMaxArraySize(), fNamespace);
    AtPlace(assignment.fName, kZEPStatusOK, "", [&] { property->SetValue(value, kNone); });
  }
}

void TMofInstances::SetKeys(std::size_t number) {
  if (fMade[number].fKeys == kSet) return;
  fMade[number].fKeys = kBeingSet;
  ++fDepth;
  SetAliases(number, true);
  --fDepth;
  fMade[number].fKeys = kSet;
}

// Those among the keys, or all others.
void TMofInstances::SetAliases(std::size_t number, bool keys) {
  auto const isBefore = [](TAliasValue const& value, std::size_t wanted) { return value.fNumber < wanted; };
  auto value = std::lower_bound(fAliasValues.begin(), fAliasValues.end(), number, isBefore);
  for (; value != fAliasValues.end() && value->fNumber == number; ++value) {
    auto const property = PropertyOf(number, value->fName);
    if (property->GetDeclaration(kNone)->IsKey(kNone) != keys) continue;
    TCIMValue const path = PathOf(value->fAlias);
    AtPlace(value->fName, kZEPStatusTypeMismatch, "is no reference", [&] { property->SetValue(path, kNone); });
  }
}

void TMofInstances::Commit(std::size_t number) {
  AtPlace(fMade[number].fClassName, kZEPStatusAlreadyExists, "has another instance with the same keys",
          [&] { fMade[number].fClass->CommitInstance(fMade[number].fInstance, kNone); });
}

boost::shared_ptr<ICIMProperty> TMofInstances::PropertyOf(std::size_t number, TMofPlace const& name) const {
  auto const property = fMade[number].fInstance->GetProperty(NameAt(name), kNone);
  if (!property) throw TMofError(name, NameAt(name) + " is no property of the class", kZEPStatusNotFound);
  return property;
}

TCIMValue TMofInstances::PathOf(TMofPlace const& alias) {
  auto const found = fAliases.find(FoldName(NameAt(alias)));
  if (found == fAliases.end()) throw TMofError(alias, NameAt(alias) + " is the alias of no instance", kZEPStatusNotFound);
  if (fMade[found->second].fKeys == kBeingSet) throw TMofError(alias, NameAt(alias) + " is needed to tell its own keys");
  if (fDepth > kMostNestedKeys) throw TMofError(alias, "keys lead from one instance to another more than 8 deep");
  SetKeys(found->second);
  TCIMReference path = fMade[found->second].fInstance->GetPath(kNone);
  return TCIMValue(path);
}

}  // namespace NQRVZEP20
