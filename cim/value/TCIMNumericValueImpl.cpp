// SPDX-License-Identifier: Apache-2.0
#include "TCIMNumericValueImpl.h"

#include "cim/value/IntegerText.h"
#include "cim/value/RealText.h"
#include "cim/value/ScalarTypes.h"

#include <string_view>
#include <type_traits>

namespace NQRVZEP20 {

using TType = TCIMValue::TCIMType;

namespace {

void RequireRadix(unsigned char radix) {
  if (radix != 10 && radix != 16 && radix != 8) throw TZEPException(kZEPStatusNotSupported);
}

void RequireDecimal(unsigned char radix) {
  if (radix != 10) throw TZEPException(kZEPStatusNotSupported);
}

// Writes a number to `place` and returns the end of the text. IntegerText.h says how much room it needs.
template <class TNumber>
char* PutNumber(char* place, TNumber number, unsigned char radix) {
  if constexpr (std::is_same_v<TNumber, bool>) {
    std::string_view const text = number ? "true" : "false";
    return place + text.copy(place, text.size());
  } else if constexpr (std::is_floating_point_v<TNumber>) {
    RequireDecimal(radix);
    return PutReal(place, number);
  } else if constexpr (std::is_signed_v<TNumber>) {
    RequireDecimal(radix);
    return PutDecimal(place, static_cast<long>(number));
  } else {
    if (radix == 10) return PutDecimal(place, static_cast<unsigned long>(number));
    return radix == 16 ? PutHex(place, number) : PutOctal(place, number);
  }
}

template <class TNumber>
std::string LongTextOf(TNumber number, unsigned char radix) {
  char text[kRoomForInteger];
  return std::string(text, PutNumber(text, number, radix));
}

// Writes directly into a string that is short enough to need no allocation.
template <class TNumber>
std::string ShortTextOf(TNumber number, unsigned char radix) {
  std::string text("               ", kRoomForShort);
  text.erase(static_cast<std::size_t>(PutNumber(text.data(), number, radix) - text.data()));
  return text;
}

template <class TUnsigned>
std::string HexText(TUnsigned number) {
  std::string text("0000000000000000", 2 * sizeof number);
  PutHex(text.data(), number);
  return text;
}

template <class TNumber>
std::string TextOf(TNumber number, unsigned char radix) {
  constexpr bool kIsInteger = std::is_integral_v<TNumber> && !std::is_same_v<TNumber, bool>;
  if constexpr (kIsInteger && std::is_unsigned_v<TNumber>)
    if (radix == 16) return HexText(number);
  return kIsInteger && sizeof number == 8 ? LongTextOf(number, radix) : ShortTextOf(number, radix);
}

// The stored number, read without a virtual call.
template <class TNumber, class TData>
TNumber Stored(TData const& data) {
  return data.TData::operator TNumber();
}

// Calls `function` with the stored number.
template <class TResult, class TFunction>
TResult OnNumber(TType type, TCIMNumericValueImpl const& data, TFunction const& function) {
  return OnScalarType(type, [&](auto scalar) -> TResult {
    using TStorage = typename decltype(scalar)::TStorage;
    if constexpr (std::is_arithmetic_v<TStorage>) return function(Stored<TStorage>(data));
    throw TZEPException(std::is_same_v<TStorage, TCIMChar16> ? kZEPStatusNotImplemented : kZEPStatusTypeMismatch);
  });
}

void Require(bool sameType) {
  if (!sameType) throw TZEPException(kZEPStatusTypeMismatch);
}

}  // namespace

TCIMNumericValueImpl::operator bool() const {
  Require(fType == TType::kCIMTypeBoolean);
  return fBoolean;
}

TCIMNumericValueImpl::operator unsigned char() const {
  Require(fType == TType::kCIMTypeUint8);
  return fUint8;
}

TCIMNumericValueImpl::operator signed char() const {
  Require(fType == TType::kCIMTypeSint8);
  return fSint8;
}

TCIMNumericValueImpl::operator unsigned short() const {
  Require(fType == TType::kCIMTypeUint16);
  return fUint16;
}

TCIMNumericValueImpl::operator short() const {
  Require(fType == TType::kCIMTypeSint16);
  return fSint16;
}

TCIMNumericValueImpl::operator unsigned int() const {
  Require(fType == TType::kCIMTypeUint32);
  return fUint32;
}

TCIMNumericValueImpl::operator int() const {
  Require(fType == TType::kCIMTypeSint32);
  return fSint32;
}

TCIMNumericValueImpl::operator unsigned long() const {
  Require(fType == TType::kCIMTypeUint64);
  return fUint64;
}

TCIMNumericValueImpl::operator long() const {
  Require(fType == TType::kCIMTypeSint64);
  return fSint64;
}

TCIMNumericValueImpl::operator float() const {
  Require(fType == TType::kCIMTypeReal32);
  return fReal32;
}

TCIMNumericValueImpl::operator double() const {
  Require(fType == TType::kCIMTypeReal64);
  return fReal64;
}

std::string TCIMNumericValueImpl::ToString(unsigned char radix) const {
  RequireRadix(radix);
  return OnNumber<std::string>(fType, *this, [&](auto number) { return TextOf(number, radix); });
}

char* TCIMNumericValueImpl::PutText(char* place, unsigned char radix) const {
  RequireRadix(radix);
  return OnNumber<char*>(fType, *this, [&](auto number) { return PutNumber(place, number, radix); });
}

bool TCIMNumericValueImpl::operator==(TCIMValue const& other) const {
  if (other.GetType() != fType) return false;
  return OnNumber<bool>(fType, *this,
                        [&](auto mine) { return mine == Stored<decltype(mine)>(DataOf<TCIMNumericValueImpl>(other)); });
}

bool TCIMNumericValueImpl::operator<(TCIMValue const& other) const {
  if (other.GetType() != fType) return false;
  return OnNumber<bool>(fType, *this,
                        [&](auto mine) { return Stored<decltype(mine)>(DataOf<TCIMNumericValueImpl>(other)) > mine; });
}

}  // namespace NQRVZEP20
