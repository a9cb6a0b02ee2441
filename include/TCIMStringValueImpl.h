#pragma once

#include "TCIMValueImpl.h"

namespace NQRVZEP20 {

// A string: bytes, of which no encoding is assumed.
class ZEP_EXPORT TCIMStringValueImpl : public TCIMValueImpl {
public:
  TCIMStringValueImpl(std::string const& text);
  TCIMStringValueImpl(char const* text);
  TCIMStringValueImpl(TCIMStringValueImpl const& other);
  ~TCIMStringValueImpl() override;

  operator std::string() const override;

  // The text itself, neither quoted nor escaped, whatever the radix.
  std::string ToString(unsigned char radix) const override;

  // Case-sensitive, in the order of the unsigned bytes.
  bool operator==(TCIMValue const& other) const override;
  bool operator<(TCIMValue const& other) const override;

private:
  std::string const fText;
};

}  // namespace NQRVZEP20
