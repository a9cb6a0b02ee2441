// SPDX-License-Identifier: Apache-2.0
#include "TCIMValueImpl.h"  // leads to this header again, which is why the guard stands below it

#ifndef ZEP_TCIM_NUMERIC_VALUE_IMPL_H
#define ZEP_TCIM_NUMERIC_VALUE_IMPL_H

namespace NQRVZEP20 {

// The data of a TCIMValue that is a boolean, an integer or a real. They can be converted only to exactly the stored type; any
// other conversion throws kZEPStatusTypeMismatch.
class ZEP_EXPORT TCIMNumericValueImpl : public TCIMValueImpl {
public:
  TCIMNumericValueImpl(bool value) noexcept : fType(TCIMValue::TCIMType::kCIMTypeBoolean), fUint64(value) {}
  TCIMNumericValueImpl(unsigned char value) noexcept : fType(TCIMValue::TCIMType::kCIMTypeUint8), fUint64(value) {}
  TCIMNumericValueImpl(signed char value) noexcept : fType(TCIMValue::TCIMType::kCIMTypeSint8), fSint64(value) {}
  TCIMNumericValueImpl(unsigned short value) noexcept : fType(TCIMValue::TCIMType::kCIMTypeUint16), fUint64(value) {}
  TCIMNumericValueImpl(short value) noexcept : fType(TCIMValue::TCIMType::kCIMTypeSint16), fSint64(value) {}
  TCIMNumericValueImpl(unsigned int value) noexcept : fType(TCIMValue::TCIMType::kCIMTypeUint32), fUint64(value) {}
  TCIMNumericValueImpl(int value) noexcept : fType(TCIMValue::TCIMType::kCIMTypeSint32), fSint64(value) {}
  TCIMNumericValueImpl(unsigned long value) noexcept : fType(TCIMValue::TCIMType::kCIMTypeUint64), fUint64(value) {}
  TCIMNumericValueImpl(long value) noexcept : fType(TCIMValue::TCIMType::kCIMTypeSint64), fSint64(value) {}
  TCIMNumericValueImpl(float value) noexcept : fType(TCIMValue::TCIMType::kCIMTypeReal32), fReal32(value) {}
  TCIMNumericValueImpl(double value) noexcept : fType(TCIMValue::TCIMType::kCIMTypeReal64), fReal64(value) {}
  TCIMNumericValueImpl(TCIMNumericValueImpl const& other) noexcept = default;
  ~TCIMNumericValueImpl() override = default;

  operator bool() const override;
  operator unsigned char() const override;
  operator signed char() const override;
  operator unsigned short() const override;
  operator short() const override;
  operator unsigned int() const override;
  operator int() const override;
  operator unsigned long() const override;
  operator long() const override;
  operator float() const override;
  operator double() const override;

  // `radix` is 10, 16 or 8; any other value throws kZEPStatusNotSupported, for a boolean too. Unsigned integers can be
  // printed in all three: base 16 uses upper-case digits and is zero-padded to the width of the type, base 8 is not padded.
  // Signed integers and reals can be printed in base 10 only and throw kZEPStatusNotSupported for 8 and 16. A boolean is
  // printed as "true" or "false". A real is printed like printf's %g: six significant digits, with a decimal point in every
  // locale.
  std::string ToString(unsigned char radix) const override;

  // Values of different types are neither equal nor ordered: for uint8 5 and uint16 5, == and < return false. Kept. A NaN is
  // not equal to anything, not even to itself, and < is false when either side is a NaN.
  bool operator==(TCIMValue const& other) const override;
  bool operator<(TCIMValue const& other) const override;

private:
  friend class TCIMArrayValueImpl;
  friend class TCIMValue;

  // Like ==, with a number of the same type.
  bool EqualsNumber(TCIMNumericValueImpl const& other) const noexcept {
    if (fType == TCIMValue::TCIMType::kCIMTypeReal64) return fReal64 == other.fReal64;
    if (fType == TCIMValue::TCIMType::kCIMTypeReal32) return fReal32 == other.fReal32;
    return fUint64 == other.fUint64;
  }

  // Like ToString, but writes the text to `place`, which has room for 32 bytes, and returns the end of the text.
  char* PutText(char* place, unsigned char radix) const;

protected:
  TCIMValue::TCIMType fType;  // kCIMTypeBoolean to kCIMTypeReal64
  union {                     // the member that fType selects; integers are stored as 64 bits
    bool fBoolean;
    unsigned char fUint8;
    signed char fSint8;
    unsigned short fUint16;
    short fSint16;
    unsigned int fUint32;
    int fSint32;
    unsigned long fUint64;
    long fSint64;
    float fReal32;
    double fReal64;
  };
};

}  // namespace NQRVZEP20

#endif
