// SPDX-License-Identifier: Apache-2.0
#include "TCIMValueImpl.h"  // leads to this header again, which is why the guard stands below it

#ifndef ZEP_TCIM_STRING_VALUE_IMPL_H
#define ZEP_TCIM_STRING_VALUE_IMPL_H

namespace NQRVZEP20 {

// The data of a TCIMValue that is a string: bytes in any encoding.
class ZEP_EXPORT TCIMStringValueImpl : public TCIMValueImpl {
public:
  TCIMStringValueImpl(std::string const& text) : fText(text) {}
  TCIMStringValueImpl(char const* text) : fText(text) {}
  TCIMStringValueImpl(TCIMStringValueImpl const& other) = default;
  TCIMStringValueImpl(TCIMStringValueImpl&& other) noexcept = default;
  ~TCIMStringValueImpl() override = default;

  operator std::string() const override;

  // The text itself, neither quoted nor escaped, regardless of the radix.
  std::string ToString(unsigned char radix) const override;

  // Compare the strings as unsigned bytes, so case matters. False for a value that is not a string.
  bool operator==(TCIMValue const& other) const override;
  bool operator<(TCIMValue const& other) const override;

private:
  friend class TCIMValue;

  std::string fText;
};

}  // namespace NQRVZEP20

#endif
