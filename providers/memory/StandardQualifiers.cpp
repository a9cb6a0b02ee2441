// SPDX-License-Identifier: Apache-2.0
#include "StandardQualifiers.h"

#include "CIMTypes.h"
#include "ICIMQualifierDecl.h"

namespace NQRVZEP20 {

std::vector<TStandardQualifier> StandardQualifiers() {
  constexpr unsigned int kClass = ICIMQualifierDecl::kScopeClass;
  constexpr unsigned int kAssociation = ICIMQualifierDecl::kScopeAssociation;
  constexpr unsigned int kIndication = ICIMQualifierDecl::kScopeIndication;
  constexpr unsigned int kProperty = ICIMQualifierDecl::kScopeProperty;
  constexpr unsigned int kReference = ICIMQualifierDecl::kScopeReference;
  constexpr unsigned int kMethod = ICIMQualifierDecl::kScopeMethod;
  constexpr unsigned int kParameter = ICIMQualifierDecl::kScopeParameter;
  constexpr unsigned int kAny = ICIMQualifierDecl::kScopeAny;
  constexpr unsigned int kAnyClass = kClass | kAssociation | kIndication;
  constexpr unsigned int kValued = kProperty | kMethod | kParameter;  // the elements that have a value of a plain type

  constexpr unsigned int kDefault = ICIMQualifierDecl::kFlavorDefault;
  constexpr unsigned int kRestricted = ICIMQualifierDecl::kFlavorEnableOverride;  // not inherited
  constexpr unsigned int kFinal = ICIMQualifierDecl::kFlavorToSubclass;           // inherited, and not overridden
  constexpr unsigned int kTranslatable = kDefault | ICIMQualifierDecl::kFlavorTranslatable;

  using TType = TCIMValue::TCIMType;
  TCIMValue const no(false), yes(true), noText(TType::kCIMTypeString, 0), noTexts(ArrayOf(TType::kCIMTypeString), 0),
      noUint32(TType::kCIMTypeUint32, 0), noSint64(TType::kCIMTypeSint64, 0);
  return {
      {"Abstract", no, kAnyClass, kRestricted},
      {"Aggregate", no, kReference, kFinal},
      {"Aggregation", no, kAssociation, kFinal},
      {"ArrayType", TCIMValue("Bag"), kProperty | kParameter, kFinal},
      {"Association", no, kAssociation, kFinal},
      {"BitMap", noTexts, kValued, kDefault},
      {"BitValues", noTexts, kValued, kTranslatable},
      {"Composition", no, kAssociation, kFinal},
      {"Counter", no, kValued, kDefault},
      {"Deprecated", noTexts, kAny, kRestricted},
      {"Description", noText, kAny, kTranslatable},
      {"DisplayName", noText, kAny, kTranslatable},
      {"EmbeddedInstance", noText, kValued, kDefault},
      {"EmbeddedObject", no, kValued, kFinal},
      {"Exception", no, kClass | kIndication, kFinal},
      {"Experimental", no, kAny, kRestricted},
      {"Gauge", no, kValued, kDefault},
      {"In", yes, kParameter, kFinal},
      {"Indication", no, kClass | kIndication, kFinal},
      {"IsPUnit", no, kValued, kDefault},
      {"Key", no, kProperty | kReference, kFinal},
      {"MappingStrings", noTexts, kAny, kDefault},
      {"Max", noUint32, kReference, kDefault},
      {"MaxLen", noUint32, kValued, kDefault},
      {"MaxValue", noSint64, kValued, kDefault},
      {"Min", TCIMValue(0u), kReference, kDefault},
      {"MinLen", TCIMValue(0u), kValued, kDefault},
      {"MinValue", noSint64, kValued, kDefault},
      {"ModelCorrespondence", noTexts, kAny, kDefault},
      {"Octetstring", no, kValued, kFinal},
      {"Out", no, kParameter, kFinal},
      {"Override", noText, kProperty | kReference | kMethod, kRestricted},
      {"Propagated", noText, kProperty, kFinal},
      {"PUnit", noText, kValued, kDefault},
      {"Read", yes, kProperty, kDefault},
      {"Required", no, kProperty | kReference | kMethod | kParameter, kFinal},
      {"Static", no, kProperty | kMethod, kFinal},
      {"Structure", no, kClass | kIndication, kFinal},
      {"Terminal", no, kAnyClass, kDefault},
      {"Units", noText, kValued, kTranslatable},
      {"ValueMap", noTexts, kValued, kDefault},
      {"Values", noTexts, kValued, kTranslatable},
      {"Version", noText, kAnyClass, kRestricted | ICIMQualifierDecl::kFlavorTranslatable},
      {"Weak", no, kReference, kFinal},
      {"Write", no, kProperty, kDefault},
  };
}

}  // namespace NQRVZEP20
