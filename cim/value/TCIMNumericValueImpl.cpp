#include "TCIMNumericValueImpl.h"

#include "cim/value/NumberText.h"
#include "cim/value/ScalarTypes.h"

#include <type_traits>

namespace NQRVZEP20 {

using TType = TCIMValue::TCIMType;

namespace {

void RequireDecimal(unsigned char radix) {
  if (radix != 10) throw TZEPException(kZEPStatusNotSupported);
}

template <class TNumber>
std::string TextOf(TNumber number, unsigned char radix) {
  if constexpr (std::is_same_v<TNumber, bool>) {
    return number ? "true" : "false";
  } else if constexpr (std::is_floating_point_v<TNumber>) {
    RequireDecimal(radix);
    return RealText(number);
  } else if constexpr (std::is_signed_v<TNumber>) {
    RequireDecimal(radix);
    return DecimalText(static_cast<long>(number));
  } else {
    auto const unsignedNumber = static_cast<unsigned long>(number);
    return radix == 10   ? DecimalText(unsignedNumber)
           : radix == 16 ? HexText(unsignedNumber, 2 * sizeof number)
                         : OctalText(unsignedNumber);
  }
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
  if (radix != 10 && radix != 16 && radix != 8) throw TZEPException(kZEPStatusNotSupported);
  return OnNumber<std::string>(fType, *this, [&](auto number) { return TextOf(number, radix); });
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
