// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "TCIMValueImpl.h"

namespace NQRVZEP20 {

// The array kind of a TCIMValue's data. Each element is a TCIMValue of its own, which may be NULL. TCIMValue, not this
// class, checks that all elements are of one type.
class ZEP_EXPORT TCIMArrayValueImpl : public TCIMValueImpl {
public:
  TCIMArrayValueImpl(std::vector<TCIMValue> const& elements);
  TCIMArrayValueImpl(TCIMArrayValueImpl const& other);
  ~TCIMArrayValueImpl() override;

  // The elements themselves, which can be edited in place even through a constant value. Edits are not checked.
  operator std::vector<TCIMValue>&() const override;

  // "{ a, b }", each element printed with `radix`. An empty array prints "{", two blanks and "}". Strings are not quoted. An
  // exception of an element passes through, such as kZEPStatusValueIsNULL for a NULL element.
  std::string ToString(unsigned char radix) const override;

  // True when `other` is an array with the same number of elements and each element equals its counterpart. Two empty arrays
  // are equal.
  bool operator==(TCIMValue const& other) const override;

  // Arrays have no order: always throws kZEPStatusNotImplemented. Kept.
  bool operator<(TCIMValue const& other) const override;

private:
  std::vector<TCIMValue> mutable fElements;
};

}  // namespace NQRVZEP20
