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

constexpr std::size_t kMaxKeyDepth = 8;  // the text of a path doubles with each level

TCIMContext const kNone;

bool IsAlias(TMofValue const& value) { return !value.fIsArray && value.fLiterals.front().fKind == TMofLiteral::kAlias; }

TMofInstance HeadOf(TMofInstanceText const& text) { return TMofParser(*text.fFile, text.fKeyword).ParseInstanceHead(); }

}  // namespace

void TMofInstances::Build() {
  std::size_t const count = fDocument.fInstances.size();
  fCreated.reserve(count);
  for (TMofInstanceText const& instance : fDocument.fInstances) Create(HeadOf(instance));
  for (std::size_t number = 0; number < count; ++number) SetPlainValues(number);
  for (std::size_t number = 0; number < count; ++number) SetKeys(number);
  for (std::size_t number = 0; number < count; ++number) Commit(number);
  for (std::size_t number = 0; number < count; ++number) SetAliases(number, false);
}

void TMofInstances::Create(TMofInstance const& instance) {
  auto const cls = StepAt(instance.fClassName, kZEPStatusNotFound, "is not a declared class",
                          [&] { return fNamespace->GetClass(TextAt(instance.fClassName), kNone); });
  auto const made = StepAt(instance.fClassName, kZEPStatusInvalidClass, "is abstract and cannot have instances",
                           [&] { return cls->CreateInstance(kNone); });
  if (!instance.fAlias.fText.empty() && !fAliases.emplace(FoldName(TextAt(instance.fAlias)), fCreated.size()).second)
    throw TMofError(instance.fAlias, TextAt(instance.fAlias) + " is already the alias of another instance");
  fCreated.push_back({made, kNotSet});
}

void TMofInstances::SetPlainValues(std::size_t number) {
  TMofInstanceText const& text = fDocument.fInstances[number];
  TMofInstance const instance = TMofParser(*text.fFile, text.fKeyword).ParseInstance();
  std::set<std::string> seen;
  for (TMofAssignment const& assignment : instance.fValues) {
    if (!seen.insert(FoldName(TextAt(assignment.fName))).second)
      throw TMofError(assignment.fName, TextAt(assignment.fName) + " already has a value");
    auto const property = PropertyOf(number, assignment.fName);
    if (IsAlias(assignment.fValue)) {
      fAliasValues.push_back({number, assignment.fName, assignment.fValue.fSpan});
      continue;
    }
    TCIMValue const pattern = property->GetDeclaration(kNone)->GetDefaultValue(kNone);
    TCIMValue const value = ReadMofValue(assignment.fValue, pattern.GetType(), pattern.GetMaxArraySize(), fNamespace);
    StepAt(assignment.fName, kZEPStatusOK, "", [&] { property->SetValue(value, kNone); });
  }
}

void TMofInstances::SetKeys(std::size_t number) {
  if (fCreated[number].fKeys == kSet) return;
  fCreated[number].fKeys = kBeingSet;
  ++fDepth;
  SetAliases(number, true);
  --fDepth;
  fCreated[number].fKeys = kSet;
}

// Sets either the keys whose values are aliases, or the other properties.
void TMofInstances::SetAliases(std::size_t number, bool keys) {
  auto const isBefore = [](TAliasValue const& value, std::size_t wanted) { return value.fNumber < wanted; };
  auto value = std::lower_bound(fAliasValues.begin(), fAliasValues.end(), number, isBefore);
  for (; value != fAliasValues.end() && value->fNumber == number; ++value) {
    auto const property = PropertyOf(number, value->fName);
    if (property->GetDeclaration(kNone)->IsKey(kNone) != keys) continue;
    TCIMValue const path = PathOf(value->fAlias);
    StepAt(value->fName, kZEPStatusTypeMismatch, "is not a reference", [&] { property->SetValue(path, kNone); });
  }
}

void TMofInstances::Commit(std::size_t number) {
  TMofSpan const name = HeadOf(fDocument.fInstances[number]).fClassName;
  StepAt(name, kZEPStatusAlreadyExists, "already has an instance with the same keys",
         [&] { fNamespace->GetClass(TextAt(name), kNone)->CommitInstance(fCreated[number].fInstance, kNone); });
}

boost::shared_ptr<ICIMProperty> TMofInstances::PropertyOf(std::size_t number, TMofSpan const& name) const {
  auto const property = fCreated[number].fInstance->GetProperty(TextAt(name), kNone);
  if (!property) throw TMofError(name, TextAt(name) + " is not a property of the class", kZEPStatusNotFound);
  return property;
}

TCIMValue TMofInstances::PathOf(TMofSpan const& alias) {
  auto const found = fAliases.find(FoldName(TextAt(alias)));
  if (found == fAliases.end()) throw TMofError(alias, TextAt(alias) + " is not the alias of any instance", kZEPStatusNotFound);
  if (fCreated[found->second].fKeys == kBeingSet)
    throw TMofError(alias, "the keys of " + TextAt(alias) + " depend on themselves");
  if (fDepth > kMaxKeyDepth) throw TMofError(alias, "keys refer to other instances more than 8 levels deep");
  SetKeys(found->second);
  TCIMReference path = fCreated[found->second].fInstance->GetPath(kNone);
  return TCIMValue(path);
}

}  // namespace NQRVZEP20
