// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "TCIMValue.h"

#include <string>

namespace NQRVZEP20 {

// The type of a property or parameter, as in a schema: "uint32", "string[]" for an array, "uint8[16]" for an array of at most
// 16 elements; or from the library's own type tag. Any other string or tag becomes the tag kCIMTypeInvalid, which every
// declaration refuses with kZEPStatusTypeMismatch.
class TMemoryType {
public:
  TMemoryType(char const* text);
  TMemoryType(TCIMValue::TCIMType::ECIMType type) : fType(type) {}

  TCIMValue::TCIMType GetType() const { return fType; }
  unsigned int GetMaxArraySize() const { return fMaxArraySize; }         // 0: unbounded, or not an array
  TCIMValue GetNull() const { return TCIMValue(fType, fMaxArraySize); }  // a NULL value of this type

private:
  TCIMValue::TCIMType fType;
  unsigned int fMaxArraySize = 0;
};

}  // namespace NQRVZEP20
