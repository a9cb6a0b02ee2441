// SPDX-License-Identifier: Apache-2.0

// The rule of a check that compares the classes of the plug-in with those of the same name in a schema.

#include "CIMNames.h"
#include "tools/zep/output/Json.h"
#include "tools/zep/output/Text.h"
#include "tools/zep/plugin/check/Rules.h"

#include <algorithm>
#include <set>

namespace NQRVZEP20::zep {

namespace {

bool Contains(std::vector<std::string> const& names, std::string const& name) {
  return std::any_of(names.begin(), names.end(), [&](std::string const& each) { return IsSameName(each, name); });
}

// A class without a superclass does not claim to be a subclass. Superclasses may be left out.
void CompareSuperClasses(TClassContent const& cls, TClassContent const& ofSchema, TRuleResult& result) {
  if (cls.fSuperClasses.empty() && !ofSchema.fSuperClasses.empty())
    result.Note(cls.fName, "it is declared without a superclass; in the schema, that is " + ofSchema.fSuperClasses.front());
  for (std::string const& super : cls.fSuperClasses)
    if (!Contains(ofSchema.fSuperClasses, super))
      result.Find(cls.fName, "in the schema, " + super + " is not a superclass of it", "declare the superclasses of the schema");
}

void CompareDeclarations(TClassContent const& cls, TClassContent const& ofSchema, TRuleResult& result) {
  std::vector<std::string> added;
  for (TDeclaration const& declaration : cls.fDeclarations) {
    TDeclaration const* const expected = FindDeclaration(ofSchema, declaration.fName);
    std::string const place = cls.fName + "." + declaration.fName;
    if (expected == nullptr) {
      added.push_back(declaration.fName);
      continue;
    }
    if (declaration.fType != expected->fType)
      result.Find(place, "its type is " + NameOf(declaration.fType) + ", in the schema " + NameOf(expected->fType),
                  "declare it as in the schema, or under another name");
    if (declaration.fIsKey != expected->fIsKey)
      result.Find(place,
                  std::string("it is ") + (declaration.fIsKey ? "a key, but not in the schema" : "not a key as in the schema"),
                  "declare the keys of the schema");
  }
  if (!added.empty()) result.Note(cls.fName, "properties that the schema does not have: " + Joined(added, ", "));
}

// A class that only has subclasses need not declare their keys.
void CompareInstances(TClassContent const& cls, TClassContent const& ofSchema, TRuleResult& result) {
  for (TDeclaration const& expected : ofSchema.fDeclarations)
    if (expected.fIsKey && FindDeclaration(cls, expected.fName) == nullptr)
      result.Find(cls.fName + "." + expected.fName, "this key of the schema is missing", "declare the keys of the schema");
  if (ofSchema.fIsAbstract)
    result.Find(cls.fName, "it is abstract in the schema, but has instances", "choose a subclass that is not abstract");
}

// The classes that have instances of their own.
std::set<std::string> ClassesInUse(TContent const& content) {
  std::set<std::string> classes;
  for (TInstanceContent const& instance : content.fInstances) classes.insert(FoldName(instance.fClass));
  return classes;
}

bool IsOfSchema(std::string const& className) { return FoldName(className).rfind("cim_", 0) == 0; }

void CheckClass(TClassContent const& cls, bool isInUse, TNamespaceView const& schema, TRuleResult& result) {
  auto const found = schema.FindClass(cls.fName);
  if (!found) {
    if (IsOfSchema(cls.fName)) result.Note(cls.fName, "the schema does not have this class");
    return;
  }
  TClassContent const ofSchema = ContentOf(*found);
  CompareSuperClasses(cls, ofSchema, result);
  CompareDeclarations(cls, ofSchema, result);
  if (isInUse) CompareInstances(cls, ofSchema, result);
}

}  // namespace

void CheckSchema(TObservation const& observation, TRuleResult& result) {
  if (!observation.WhyNoContent().empty()) return result.CannotCheck(observation.WhyNoContent());
  if (!observation.fSchema) return result.CannotCheck(observation.fWhyNoSchema);
  for (TContent const& content : observation.fFirst.fContents) {
    std::set<std::string> const inUse = ClassesInUse(content);
    for (TClassContent const& cls : content.fClasses)
      CheckClass(cls, inUse.count(FoldName(cls.fName)) > 0, *observation.fSchema, result);
  }
}

}  // namespace NQRVZEP20::zep
