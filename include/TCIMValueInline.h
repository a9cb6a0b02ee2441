// SPDX-License-Identifier: Apache-2.0
#pragma once

// The parts of TCIMValue that are compiled into its callers: making, copying, comparing and reading a number or a string takes
// a third of the time of a call into the library. TCIMValue.h includes this header; include that one.

#include "TCIMNumericValueImpl.h"
#include "TCIMStringValueImpl.h"
#include "TCIMValue.h"

#include <new>
#include <utility>

namespace NQRVZEP20 {

inline TCIMNumericValueImpl const& TCIMValue::Number() const noexcept { return static_cast<TCIMNumericValueImpl const&>(*fData); }
inline TCIMStringValueImpl const& TCIMValue::String() const noexcept { return static_cast<TCIMStringValueImpl const&>(*fData); }

// The data of a value that is NULL until now.
template <class TSource>
TCIMValueImpl* TCIMValue::NewNumber(TSource const& source) noexcept {
  static_assert(sizeof(TCIMNumericValueImpl) <= sizeof fPlace && alignof(TCIMNumericValueImpl) <= alignof(void*));
  return new (fPlace) TCIMNumericValueImpl(source);
}

template <class TSource>
TCIMValueImpl* TCIMValue::NewString(TSource&& source) {
  static_assert(sizeof(TCIMStringValueImpl) <= sizeof fPlace && alignof(TCIMStringValueImpl) <= alignof(void*));
  return new (fPlace) TCIMStringValueImpl(std::forward<TSource>(source));
}

// ---- Construction and destruction ----

inline TCIMValue::TCIMValue() noexcept : fType(TCIMType::kCIMTypeInvalid) {}

inline TCIMValue::TCIMValue(bool value) : fType(TCIMType::kCIMTypeBoolean), fData(NewNumber(value)) {}
inline TCIMValue::TCIMValue(unsigned char value) : fType(TCIMType::kCIMTypeUint8), fData(NewNumber(value)) {}
inline TCIMValue::TCIMValue(signed char value) : fType(TCIMType::kCIMTypeSint8), fData(NewNumber(value)) {}
inline TCIMValue::TCIMValue(unsigned short value) : fType(TCIMType::kCIMTypeUint16), fData(NewNumber(value)) {}
inline TCIMValue::TCIMValue(short value) : fType(TCIMType::kCIMTypeSint16), fData(NewNumber(value)) {}
inline TCIMValue::TCIMValue(unsigned int value) : fType(TCIMType::kCIMTypeUint32), fData(NewNumber(value)) {}
inline TCIMValue::TCIMValue(int value) : fType(TCIMType::kCIMTypeSint32), fData(NewNumber(value)) {}
inline TCIMValue::TCIMValue(unsigned long value) : fType(TCIMType::kCIMTypeUint64), fData(NewNumber(value)) {}
inline TCIMValue::TCIMValue(long value) : fType(TCIMType::kCIMTypeSint64), fData(NewNumber(value)) {}
inline TCIMValue::TCIMValue(float value) : fType(TCIMType::kCIMTypeReal32), fData(NewNumber(value)) {}
inline TCIMValue::TCIMValue(double value) : fType(TCIMType::kCIMTypeReal64), fData(NewNumber(value)) {}
inline TCIMValue::TCIMValue(char const* value) : fType(TCIMType::kCIMTypeString), fData(NewString(value)) {}
inline TCIMValue::TCIMValue(std::string const& value) : fType(TCIMType::kCIMTypeString), fData(NewString(value)) {}

inline TCIMValue::TCIMValue(TCIMValue const& other) : fType(other.fType) {
  if (other.HoldsNumber())
    fData = NewNumber(other.Number());
  else if (other.HoldsString())
    fData = NewString(other.String());
  else
    CopyOther(other);
}

inline TCIMValue::~TCIMValue() {
  if (HoldsString())
    String().TCIMStringValueImpl::~TCIMStringValueImpl();
  else if (fData != nullptr && !IsNumber())  // a number needs no destruction
    DestroyData();
}

// ---- Conversions ----

inline TCIMNumericValueImpl const& TCIMValue::NumberAs(TCIMType required) const {
  if (fType != required || fData == nullptr) Refuse();
  return Number();
}

inline TCIMValue::operator bool() const { return NumberAs(TCIMType::kCIMTypeBoolean).fBoolean; }
inline TCIMValue::operator unsigned char() const { return NumberAs(TCIMType::kCIMTypeUint8).fUint8; }
inline TCIMValue::operator signed char() const { return NumberAs(TCIMType::kCIMTypeSint8).fSint8; }
inline TCIMValue::operator unsigned short() const { return NumberAs(TCIMType::kCIMTypeUint16).fUint16; }
inline TCIMValue::operator short() const { return NumberAs(TCIMType::kCIMTypeSint16).fSint16; }
inline TCIMValue::operator unsigned int() const { return NumberAs(TCIMType::kCIMTypeUint32).fUint32; }
inline TCIMValue::operator int() const { return NumberAs(TCIMType::kCIMTypeSint32).fSint32; }
inline TCIMValue::operator unsigned long() const { return NumberAs(TCIMType::kCIMTypeUint64).fUint64; }
inline TCIMValue::operator long() const { return NumberAs(TCIMType::kCIMTypeSint64).fSint64; }
inline TCIMValue::operator float() const { return NumberAs(TCIMType::kCIMTypeReal32).fReal32; }
inline TCIMValue::operator double() const { return NumberAs(TCIMType::kCIMTypeReal64).fReal64; }

// ---- Comparisons ----

inline bool TCIMValue::operator==(TCIMValue const& other) const {
  if (fType != other.fType || IsNull() != other.IsNull()) return false;
  if (HoldsNumber()) return Number().EqualsNumber(other.Number());
  if (HoldsString()) return String().fText == other.String().fText;
  return EqualsOther(other);
}

inline bool TCIMValue::operator<(TCIMValue const& other) const {
  if (HoldsString() && other.HoldsString()) return String().fText < other.String().fText;
  return IsLessThanOther(other);
}

}  // namespace NQRVZEP20
