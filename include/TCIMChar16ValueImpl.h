#pragma once

#include "TCIMChar16.h"
#include "TCIMValueImpl.h"

namespace NQRVZEP20 {

// A 16-bit character. A value that holds one is not NULL, but the character may be: it then can be neither printed nor
// compared (kZEPStatusInvalidDateTime).
class ZEP_EXPORT TCIMChar16ValueImpl : public TCIMValueImpl {
public:
  TCIMChar16ValueImpl(TCIMChar16 const& character);
  TCIMChar16ValueImpl(TCIMChar16ValueImpl const& other);
  ~TCIMChar16ValueImpl() override;

  operator TCIMChar16() const override;

  // The code in decimal, whatever the radix.
  std::string ToString(unsigned char radix) const override;

  // As TCIMChar16 compares: any two characters are equal, and each is less than the other.
  bool operator==(TCIMValue const& other) const override;
  bool operator<(TCIMValue const& other) const override;

private:
  TCIMChar16 const fCharacter;
};

}  // namespace NQRVZEP20
