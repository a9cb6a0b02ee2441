// SPDX-License-Identifier: Apache-2.0

// The rule of a check that compares the types of values with the declarations of their own classes.

#include "CIMNames.h"
#include "tools/zep/output/Json.h"
#include "tools/zep/plugin/check/Rules.h"

#include <map>

namespace NQRVZEP20::zep {

namespace {

using TClasses = std::map<std::string, TClassContent const*>;  // by their names in one case

TClasses ClassesByName(TContent const& content) {
  TClasses classes;
  for (TClassContent const& cls : content.fClasses) classes[FoldName(cls.fName)] = &cls;
  return classes;
}

// The type of a NULL is not judged.
void CheckTypesOf(TInstanceContent const& instance, TClassContent const& cls, TRuleResult& result) {
  for (TPropertyContent const& property : instance.fProperties) {
    TDeclaration const* const declaration = FindDeclaration(cls, property.fName);
    std::string const place = instance.fPath + "." + property.fName;
    if (declaration == nullptr)
      result.Find(place, "its class " + cls.fName + " does not declare this property", "declare it");
    else if (!property.fValue.IsNull() && property.fValue.GetType() != declaration->fType)
      result.Find(place,
                  "the type of its value is " + NameOf(property.fValue.GetType()) + ", and its class declares " +
                      NameOf(declaration->fType),
                  "convert the value to the declared type");
  }
}

}  // namespace

void CheckTypes(TObservation const& observation, TRuleResult& result) {
  result.CannotCheck(observation.WhyNoContent());
  for (TContent const& content : observation.fFirst.fContents) {
    TClasses const classes = ClassesByName(content);
    for (TInstanceContent const& instance : content.fInstances) {
      auto const cls = classes.find(FoldName(instance.fClass));
      if (cls == classes.end())
        result.Find(instance.fPath, "the namespace does not have its class " + instance.fClass, "declare the class");
      else
        CheckTypesOf(instance, *cls->second, result);
    }
  }
}

}  // namespace NQRVZEP20::zep
