// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "TCIMChar16.h"
#include "TCIMValueImpl.h"

namespace NQRVZEP20 {

// The data of a TCIMValue that is a char16. Such a value is not NULL, but its character may be NULL; printing or comparing a
// NULL character throws kZEPStatusInvalidDateTime.
class ZEP_EXPORT TCIMChar16ValueImpl : public TCIMValueImpl {
public:
  TCIMChar16ValueImpl(TCIMChar16 const& character);
  TCIMChar16ValueImpl(TCIMChar16ValueImpl const& other);
  ~TCIMChar16ValueImpl() override;

  operator TCIMChar16() const override;

  // The code in decimal, regardless of the radix.
  std::string ToString(unsigned char radix) const override;

  // Compare as TCIMChar16 does: any two characters are equal, and each is less than the other.
  bool operator==(TCIMValue const& other) const override;
  bool operator<(TCIMValue const& other) const override;

private:
  TCIMChar16 const fCharacter;
};

}  // namespace NQRVZEP20
