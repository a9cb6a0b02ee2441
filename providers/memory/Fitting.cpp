// SPDX-License-Identifier: Apache-2.0
#include "Fitting.h"

#include "CIMTypes.h"
#include "ICIMNamespace.h"

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

}  // namespace NQRVZEP20
