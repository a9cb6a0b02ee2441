// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "TCIMValueImpl.h"

namespace NQRVZEP20 {

// The data of a TCIMValue that is an array. Each element is a TCIMValue, which may be NULL. TCIMValue, not this class, checks
// that all elements have the same type.
class ZEP_EXPORT TCIMArrayValueImpl : public TCIMValueImpl {
public:
  TCIMArrayValueImpl(std::vector<TCIMValue> const& elements);
  TCIMArrayValueImpl(TCIMArrayValueImpl const& other);
  ~TCIMArrayValueImpl() override;

  // The elements themselves, which can be edited in place even through a constant value. Edits are not checked.
  operator std::vector<TCIMValue>&() const override;

  // "{ a, b }", with each element printed in `radix`. An empty array is printed as "{", two blanks and "}". Strings are not
  // quoted. Exceptions thrown by an element pass through, such as kZEPStatusValueIsNULL for a NULL element.
  std::string ToString(unsigned char radix) const override;

  // True when `other` is an array with the same number of elements and each element equals its counterpart. Two empty arrays
  // are equal.
  bool operator==(TCIMValue const& other) const override;

  // Always throws kZEPStatusNotImplemented: arrays have no order. Kept.
  bool operator<(TCIMValue const& other) const override;

private:
  std::vector<TCIMValue> mutable fElements;
};

}  // namespace NQRVZEP20
