// SPDX-License-Identifier: Apache-2.0
#include "Fitting.h"

#include "CIMTypes.h"
#include "ICIMNamespace.h"

#include <cstdint>
#include <limits>

namespace NQRVZEP20 {

namespace {

bool IsInteger(TCIMValue::TCIMType type) {
  return type >= TCIMValue::TCIMType::kCIMTypeUint8 && type <= TCIMValue::TCIMType::kCIMTypeSint64;
}

TCIMValue NullLike(TCIMValue const& pattern) {
  TCIMValue null(pattern);
  null.SetNullValue(pattern.GetType(), pattern.GetMaxArraySize());
  return null;
}

TCIMValue WithBoundOf(TCIMValue const& pattern, TCIMValue const& array) {
  if (array.IsNull()) return NullLike(pattern);
  std::vector<TCIMValue> const& elements = array;
  return TCIMValue(BaseTypeOf(array.GetType()), pattern.GetMaxArraySize(), elements);
}

// "uint16", "string[]"; for a value that has no type, "value without a type".
std::string NameOf(TCIMValue::TCIMType type) {
  if (!HasTypeName(type)) return "value without a type";
  return type.ToString() + (IsArrayType(type) ? "[]" : "");
}

template <class T>
std::string RangeOf() {
  return std::to_string(std::numeric_limits<T>::min()) + " to " + std::to_string(std::numeric_limits<T>::max());
}

std::string RangeOf(TCIMValue::TCIMType integer) {
  switch (integer) {
    case TCIMValue::TCIMType::kCIMTypeUint8:
      return RangeOf<std::uint8_t>();
    case TCIMValue::TCIMType::kCIMTypeSint8:
      return RangeOf<std::int8_t>();
    case TCIMValue::TCIMType::kCIMTypeUint16:
      return RangeOf<std::uint16_t>();
    case TCIMValue::TCIMType::kCIMTypeSint16:
      return RangeOf<std::int16_t>();
    case TCIMValue::TCIMType::kCIMTypeUint32:
      return RangeOf<std::uint32_t>();
    case TCIMValue::TCIMType::kCIMTypeSint32:
      return RangeOf<std::int32_t>();
    case TCIMValue::TCIMType::kCIMTypeUint64:
      return RangeOf<std::uint64_t>();
    default:
      return RangeOf<std::int64_t>();
  }
}

}  // namespace

TCIMValue FittedTo(TCIMValue const& pattern, TCIMValue const& value) {
  TCIMValue::TCIMType const type = pattern.GetType();
  if (value.GetType() == type) return value.IsArray() ? WithBoundOf(pattern, value) : value;
  if (value.GetType() == TCIMValue::TCIMType::kCIMTypeInvalid) return NullLike(pattern);
  if (value.IsNull() || !IsInteger(type) || !IsInteger(value.GetType())) return value;

  std::string digits = value.ToString();
  TCIMValue const converted(type, digits, boost::shared_ptr<ICIMNamespace>());
  return converted.ToString() == digits ? converted : value;  // a number out of range changes
}

std::string WhyNotOf(TCIMValue::TCIMType declared, TCIMValue const& value) {
  bool const isNumber = !value.IsNull() && IsInteger(value.GetType());
  if (isNumber && IsInteger(declared))
    return value.ToString() + " is outside the range of " + NameOf(declared) + ", " + RangeOf(declared);
  return "the value is a " + std::string(value.IsNull() ? "NULL " : "") + NameOf(value.GetType()) + " instead of a " +
         NameOf(declared);
}

}  // namespace NQRVZEP20
