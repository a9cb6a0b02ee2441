#pragma once

#include "TCIMValueImpl.h"

namespace NQRVZEP20 {

// An array: its elements, each a TCIMValue of its own, which may be NULL. That they are of one type is TCIMValue's affair.
class ZEP_EXPORT TCIMArrayValueImpl : public TCIMValueImpl {
public:
  TCIMArrayValueImpl(std::vector<TCIMValue> const& elements);
  TCIMArrayValueImpl(TCIMArrayValueImpl const& other);
  ~TCIMArrayValueImpl() override;

  // The elements themselves, to be edited in place even through a constant value. Edits are checked against nothing.
  operator std::vector<TCIMValue>&() const override;

  // "{ a, b }", each element printed with `radix`; an empty array is "{  }", with both blanks. Strings are not quoted.
  // Throws what an element throws, so kZEPStatusValueIsNULL for a NULL element.
  std::string ToString(unsigned char radix) const override;

  // Equal: another array of as many elements, each pair equal in order. Two empty arrays are equal.
  bool operator==(TCIMValue const& other) const override;

  // Arrays have no order: always throws kZEPStatusNotImplemented.
  bool operator<(TCIMValue const& other) const override;

private:
  std::vector<TCIMValue> mutable fElements;
};

}  // namespace NQRVZEP20
