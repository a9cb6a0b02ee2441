// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "TCIMArrayValueImpl.h"
#include "TCIMChar16ValueImpl.h"
#include "TCIMDateTimeValueImpl.h"
#include "TCIMNumericValueImpl.h"
#include "TCIMReferenceValueImpl.h"
#include "TCIMStringValueImpl.h"
#include "TCIMValue.h"
#include "TZEPException.h"

namespace NQRVZEP20 {

// The C++ side of a scalar CIM type: the type that stores it, and the kind of TCIMValueImpl that holds it.
template <class TStorageType, class TKindType>
struct TScalarType {
  using TStorage = TStorageType;
  using TKind = TKindType;
};

// The one switch over the type tag: calls `function` with the TScalarType of a scalar tag and returns its result. Throws
// kZEPStatusTypeMismatch for any other tag.
template <class TFunction>
auto OnScalarType(TCIMValue::TCIMType::ECIMType type, TFunction const& function) {
  using TType = TCIMValue::TCIMType;
  switch (type) {
    case TType::kCIMTypeBoolean:
      return function(TScalarType<bool, TCIMNumericValueImpl>());
    case TType::kCIMTypeUint8:
      return function(TScalarType<unsigned char, TCIMNumericValueImpl>());
    case TType::kCIMTypeSint8:
      return function(TScalarType<signed char, TCIMNumericValueImpl>());
    case TType::kCIMTypeUint16:
      return function(TScalarType<unsigned short, TCIMNumericValueImpl>());
    case TType::kCIMTypeSint16:
      return function(TScalarType<short, TCIMNumericValueImpl>());
    case TType::kCIMTypeUint32:
      return function(TScalarType<unsigned int, TCIMNumericValueImpl>());
    case TType::kCIMTypeSint32:
      return function(TScalarType<int, TCIMNumericValueImpl>());
    case TType::kCIMTypeUint64:
      return function(TScalarType<unsigned long, TCIMNumericValueImpl>());
    case TType::kCIMTypeSint64:
      return function(TScalarType<long, TCIMNumericValueImpl>());
    case TType::kCIMTypeReal32:
      return function(TScalarType<float, TCIMNumericValueImpl>());
    case TType::kCIMTypeReal64:
      return function(TScalarType<double, TCIMNumericValueImpl>());
    case TType::kCIMTypeChar16:
      return function(TScalarType<TCIMChar16, TCIMChar16ValueImpl>());
    case TType::kCIMTypeString:
      return function(TScalarType<std::string, TCIMStringValueImpl>());
    case TType::kCIMTypeDateTime:
      return function(TScalarType<TCIMDateTime, TCIMDateTimeValueImpl>());
    case TType::kCIMTypeReference:
      return function(TScalarType<TCIMReference, TCIMReferenceValueImpl>());
    default:
      throw TZEPException(kZEPStatusTypeMismatch);
  }
}

}  // namespace NQRVZEP20
