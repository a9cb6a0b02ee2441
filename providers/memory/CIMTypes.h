// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "TCIMValue.h"

namespace NQRVZEP20 {

// Properties of type tags.

inline TCIMValue::TCIMType BaseTypeOf(TCIMValue::TCIMType type) {
  return static_cast<TCIMValue::TCIMType::ECIMType>(type & ~TCIMValue::TCIMType::kCIMTypeArrayFlag);
}

inline bool IsArrayType(TCIMValue::TCIMType type) { return (type & TCIMValue::TCIMType::kCIMTypeArrayFlag) != 0; }

// One of the fifteen CIM types, or an array of it.
inline bool HasTypeName(TCIMValue::TCIMType type) {
  TCIMValue::TCIMType const base = BaseTypeOf(type);
  return base >= TCIMValue::TCIMType::kCIMTypeBoolean && base <= TCIMValue::TCIMType::kCIMTypeReference;
}

inline TCIMValue::TCIMType ArrayOf(TCIMValue::TCIMType type) {
  return static_cast<TCIMValue::TCIMType::ECIMType>(type | TCIMValue::TCIMType::kCIMTypeArrayFlag);
}

}  // namespace NQRVZEP20
