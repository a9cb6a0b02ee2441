#pragma once

#include "TCIMValueImpl.h"

namespace NQRVZEP20 {

// A boolean, an integer or a real. It is read only as exactly the type it is stored as: any other conversion throws
// kZEPStatusTypeMismatch.
class ZEP_EXPORT TCIMNumericValueImpl : public TCIMValueImpl {
public:
  TCIMNumericValueImpl(bool value) noexcept : fType(TCIMValue::TCIMType::kCIMTypeBoolean), fBoolean(value) {}
  TCIMNumericValueImpl(unsigned char value) noexcept : fType(TCIMValue::TCIMType::kCIMTypeUint8), fUint8(value) {}
  TCIMNumericValueImpl(signed char value) noexcept : fType(TCIMValue::TCIMType::kCIMTypeSint8), fSint8(value) {}
  TCIMNumericValueImpl(unsigned short value) noexcept : fType(TCIMValue::TCIMType::kCIMTypeUint16), fUint16(value) {}
  TCIMNumericValueImpl(short value) noexcept : fType(TCIMValue::TCIMType::kCIMTypeSint16), fSint16(value) {}
  TCIMNumericValueImpl(unsigned int value) noexcept : fType(TCIMValue::TCIMType::kCIMTypeUint32), fUint32(value) {}
  TCIMNumericValueImpl(int value) noexcept : fType(TCIMValue::TCIMType::kCIMTypeSint32), fSint32(value) {}
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

  // `radix` is 10, 16 or 8; anything else throws kZEPStatusNotSupported, for a boolean too. Unsigned integers print in each,
  // in base 16 with capitals and zeros up to the width of the type, in base 8 without padding. Signed integers and reals
  // print in decimal only and otherwise throw kZEPStatusNotSupported. A boolean is "true" or "false". A real has six
  // significant digits, fixed or with an exponent, whichever is shorter, and a point whatever the process's locale is.
  std::string ToString(unsigned char radix) const override;

  // No comparison across types: uint8 5 and uint16 5 are neither equal nor ordered. A NaN equals nothing, not even itself,
  // and nothing is less or greater.
  bool operator==(TCIMValue const& other) const override;
  bool operator<(TCIMValue const& other) const override;

private:
  friend class TCIMArrayValueImpl;

  // ToString without the string: writes the text at `place`, where there is room for 32 bytes, and returns its end.
  char* PutText(char* place, unsigned char radix) const;

protected:
  TCIMValue::TCIMType fType;  // kCIMTypeBoolean to kCIMTypeReal64
  union {                     // the member of that type
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
