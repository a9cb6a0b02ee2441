// SPDX-License-Identifier: Apache-2.0
#include "TCIMValue.h"

#include "cim/value/ReadNumber.h"
#include "cim/value/ScalarTypes.h"
#include "core/Failure.h"

#include <array>
#include <cctype>
#include <ostream>
#include <string_view>
#include <type_traits>

namespace NQRVZEP20 {

using TType = TCIMValue::TCIMType;

namespace {

constexpr std::array<std::string_view, 16> kTypeNames = {
    "",       "boolean", "uint8",  "sint8",  "uint16", "sint16", "uint32",   "sint32",
    "uint64", "sint64",  "real32", "real64", "char16", "string", "datetime", "reference",
};

constexpr bool IsScalar(int type) { return type > 0 && type < static_cast<int>(kTypeNames.size()); }

TType::ECIMType TypeOfName(std::string name) {
  for (char& c : name) c = static_cast<char>(std::tolower(static_cast<unsigned char>(c)));
  for (int type = TType::kCIMTypeBoolean; IsScalar(type); ++type)
    if (kTypeNames[type] == name) return TType::ECIMType(type);
  return TType::kCIMTypeInvalid;
}

TType ArrayOf(TType type) { return TType::ECIMType(type | TType::kCIMTypeArrayFlag); }
TType ElementOf(TType type) { return TType::ECIMType(type & ~TType::kCIMTypeArrayFlag); }

void RequireElementsOf(TType type, std::vector<TCIMValue> const& elements) {
  for (TCIMValue const& element : elements) {
    if (element.GetType() == type) continue;
    LogErrorAndThrow(kZEPStatusInvalidProperty, "Core: ERROR: ",
                     "Attempting to create array of type " + type.ToString() + ", but element is of type " +
                         element.GetType().ToString() + ".");
  }
}

}  // namespace

// ---- The type tag ----

TCIMValue::TCIMType::TCIMType(std::string name) : fType(TypeOfName(std::move(name))) {}

std::string TCIMValue::TCIMType::ToString() const {
  int const type = ElementOf(fType);
  if (!IsScalar(type)) throw TZEPException(kZEPStatusTypeMismatch);
  return std::string(kTypeNames[type]);
}

std::ostream& operator<<(std::ostream& stream, TCIMValue::TCIMType const& type) { return stream << type.ToString(); }

// ---- The owner of the data ----

TCIMValue::TData::TData(TCIMNumericValueImpl const& number) noexcept : fImpl(new (fPlace) TCIMNumericValueImpl(number)) {
  static_assert(sizeof number <= sizeof fPlace && alignof(TCIMNumericValueImpl) <= alignof(void*));
}

TCIMValue::TData::TData(std::unique_ptr<TCIMValueImpl> data) noexcept : fImpl(data.release()) {}

TCIMValue::TData TCIMValue::TData::CopyOf(TCIMType type, TData const& other) {
  if (!other) return TData();
  if (type & TType::kCIMTypeArrayFlag)
    return TData(std::make_unique<TCIMArrayValueImpl>(static_cast<TCIMArrayValueImpl const&>(*other)));
  return OnScalarType(type, [&](auto scalar) {
    using TKind = typename decltype(scalar)::TKind;
    auto const& data = static_cast<TKind const&>(*other);
    if constexpr (std::is_same_v<TKind, TCIMNumericValueImpl>)
      return TData(data);
    else
      return TData(std::make_unique<TKind>(data));
  });
}

TCIMValue::TData::TData(TData&& other) noexcept { Take(other); }

TCIMValue::TData& TCIMValue::TData::operator=(TData&& other) noexcept {
  TData const old(std::move(*this));  // destroyed last, because `other` may be part of it
  Take(other);
  return *this;
}

TCIMValue::TData::~TData() {
  if (!IsInPlace()) delete fImpl;  // a number needs no destruction
}

bool TCIMValue::TData::IsInPlace() const noexcept { return static_cast<void const*>(fImpl) == fPlace; }

void TCIMValue::TData::Take(TData& other) noexcept {
  fImpl = other.IsInPlace() ? new (fPlace) TCIMNumericValueImpl(static_cast<TCIMNumericValueImpl&>(*other.fImpl)) : other.fImpl;
  other.fImpl = nullptr;
}

// ---- Construction ----

TCIMValue::TCIMValue() noexcept : fType(TType::kCIMTypeInvalid), fMaxArraySize(0) {}

TCIMValue::TCIMValue(TCIMType type, unsigned int arraySize)
    : fType(arraySize != 0 ? ArrayOf(type) : type), fMaxArraySize(arraySize) {}

TCIMValue::TCIMValue(TCIMType type, TData data) noexcept : fType(type), fData(std::move(data)), fMaxArraySize(0) {}

TCIMValue::TCIMValue(bool value) : TCIMValue(TType::kCIMTypeBoolean, TData(TCIMNumericValueImpl(value))) {}
TCIMValue::TCIMValue(unsigned char value) : TCIMValue(TType::kCIMTypeUint8, TData(TCIMNumericValueImpl(value))) {}
TCIMValue::TCIMValue(signed char value) : TCIMValue(TType::kCIMTypeSint8, TData(TCIMNumericValueImpl(value))) {}
TCIMValue::TCIMValue(unsigned short value) : TCIMValue(TType::kCIMTypeUint16, TData(TCIMNumericValueImpl(value))) {}
TCIMValue::TCIMValue(short value) : TCIMValue(TType::kCIMTypeSint16, TData(TCIMNumericValueImpl(value))) {}
TCIMValue::TCIMValue(unsigned int value) : TCIMValue(TType::kCIMTypeUint32, TData(TCIMNumericValueImpl(value))) {}
TCIMValue::TCIMValue(int value) : TCIMValue(TType::kCIMTypeSint32, TData(TCIMNumericValueImpl(value))) {}
TCIMValue::TCIMValue(unsigned long value) : TCIMValue(TType::kCIMTypeUint64, TData(TCIMNumericValueImpl(value))) {}
TCIMValue::TCIMValue(long value) : TCIMValue(TType::kCIMTypeSint64, TData(TCIMNumericValueImpl(value))) {}
TCIMValue::TCIMValue(float value) : TCIMValue(TType::kCIMTypeReal32, TData(TCIMNumericValueImpl(value))) {}
TCIMValue::TCIMValue(double value) : TCIMValue(TType::kCIMTypeReal64, TData(TCIMNumericValueImpl(value))) {}
TCIMValue::TCIMValue(TCIMChar16 const& value) : TCIMValue() { Set(value); }
TCIMValue::TCIMValue(char const* value) : TCIMValue() { Set(value); }
TCIMValue::TCIMValue(std::string const& value) : TCIMValue() { Set(value); }
TCIMValue::TCIMValue(TCIMDateTime const& value) : TCIMValue() { Set(value); }
TCIMValue::TCIMValue(TCIMReference& value) : TCIMValue() { Set(value); }

TCIMValue::TCIMValue(TCIMType type, unsigned int maxArraySize, std::vector<TCIMValue> const& elements) : TCIMValue() {
  Set(type, maxArraySize, elements);
}

TCIMValue::TCIMValue(TCIMType type, std::string& text, boost::shared_ptr<ICIMNamespace> ns) : TCIMValue() {
  OnScalarType(type, [&](auto scalar) {
    using TStorage = typename decltype(scalar)::TStorage;
    if constexpr (std::is_same_v<TStorage, TCIMReference>) {
      TCIMReference reference(ns, text, TCIMContext());
      Set(reference);
    } else if constexpr (std::is_arithmetic_v<TStorage>) {
      // The 8-bit types are read as 32-bit numbers and cut without a range check: "300" as uint8 is 44. Kept.
      using TRead = std::conditional_t<std::is_same_v<TStorage, unsigned char>, unsigned int,
                                       std::conditional_t<std::is_same_v<TStorage, signed char>, int, TStorage>>;
      Set(static_cast<TStorage>(ReadNumber<TRead>(text)));
    } else {
      Set(static_cast<TStorage const&>(text));
    }
  });
}

TCIMValue::TCIMValue(TCIMValue const& other)
    : fType(other.fType),
      fData(TData::CopyOf(other.fType, other.fData)),
      fMaxArraySize(other.IsArray() ? other.fMaxArraySize : 0) {
  if (IsReference()) fReferencedClass = other.fReferencedClass;
}

TCIMValue::TCIMValue(TCIMValue&& other) noexcept : TCIMValue() { TakeFrom(other); }

TCIMValue::~TCIMValue() = default;

// ---- Assignment ----

TCIMValue& TCIMValue::operator=(TCIMValue const& other) {
  Set(other);
  return *this;
}

TCIMValue& TCIMValue::operator=(TCIMValue&& other) {
  if (*this == other) return *this;
  TCIMValue taken(std::move(other));  // `other` may be an element of this value, destroyed with the old data
  TakeFrom(taken);
  return *this;
}

void TCIMValue::Set(TCIMValue const& other) {
  if (*this == other) return;
  TCIMValue copy(other);
  TakeFrom(copy);
}

// Takes over the tag and the data, the maximum array size of an array and the referenced class of a reference. Leaves
// `other`, which must not be part of this value's data, in the default state.
void TCIMValue::TakeFrom(TCIMValue& other) noexcept {
  fType = std::exchange(other.fType, TType::kCIMTypeInvalid);
  fData = std::move(other.fData);
  unsigned int const maxArraySize = std::exchange(other.fMaxArraySize, 0);
  boost::shared_ptr<ICIMClass> referencedClass = std::move(other.fReferencedClass);
  if (IsArray()) fMaxArraySize = maxArraySize;
  if (IsReference()) fReferencedClass = std::move(referencedClass);
}

void TCIMValue::SetNullValue(TCIMType::ECIMType type, unsigned int arraySize) {
  SetData(type, TData());
  if (IsArray()) fMaxArraySize = arraySize;
}

void TCIMValue::SetData(TCIMType type, TData data) noexcept {
  fType = type;
  fData = std::move(data);
}

void TCIMValue::Set(bool value) { SetData(TType::kCIMTypeBoolean, TData(TCIMNumericValueImpl(value))); }
void TCIMValue::Set(unsigned char value) { SetData(TType::kCIMTypeUint8, TData(TCIMNumericValueImpl(value))); }
void TCIMValue::Set(signed char value) { SetData(TType::kCIMTypeSint8, TData(TCIMNumericValueImpl(value))); }
void TCIMValue::Set(unsigned short value) { SetData(TType::kCIMTypeUint16, TData(TCIMNumericValueImpl(value))); }
void TCIMValue::Set(short value) { SetData(TType::kCIMTypeSint16, TData(TCIMNumericValueImpl(value))); }
void TCIMValue::Set(unsigned int value) { SetData(TType::kCIMTypeUint32, TData(TCIMNumericValueImpl(value))); }
void TCIMValue::Set(int value) { SetData(TType::kCIMTypeSint32, TData(TCIMNumericValueImpl(value))); }
void TCIMValue::Set(unsigned long value) { SetData(TType::kCIMTypeUint64, TData(TCIMNumericValueImpl(value))); }
void TCIMValue::Set(long value) { SetData(TType::kCIMTypeSint64, TData(TCIMNumericValueImpl(value))); }
void TCIMValue::Set(float value) { SetData(TType::kCIMTypeReal32, TData(TCIMNumericValueImpl(value))); }
void TCIMValue::Set(double value) { SetData(TType::kCIMTypeReal64, TData(TCIMNumericValueImpl(value))); }
void TCIMValue::Set(TCIMChar16 const& value) {
  SetData(TType::kCIMTypeChar16, TData(std::make_unique<TCIMChar16ValueImpl>(value)));
}
void TCIMValue::Set(char const* value) { SetData(TType::kCIMTypeString, TData(std::make_unique<TCIMStringValueImpl>(value))); }
void TCIMValue::Set(std::string const& value) {
  SetData(TType::kCIMTypeString, TData(std::make_unique<TCIMStringValueImpl>(value)));
}

void TCIMValue::Set(TCIMDateTime const& value) {
  SetData(TType::kCIMTypeDateTime, TData(std::make_unique<TCIMDateTimeValueImpl>(value)));
}

void TCIMValue::Set(TCIMReference& value) {
  SetData(TType::kCIMTypeReference, TData(std::make_unique<TCIMReferenceValueImpl>(value)));
  fReferencedClass = value.GetClass();
}

void TCIMValue::Set(TCIMType type, unsigned int maxArraySize, std::vector<TCIMValue> const& elements) {
  SetData(ArrayOf(type), TData(std::make_unique<TCIMArrayValueImpl>(elements)));
  fMaxArraySize = maxArraySize;
  RequireElementsOf(ElementOf(type), *this);  // checks the copy: `elements` may have been this value's own
}

void TCIMValue::SetReferencedClass(boost::shared_ptr<ICIMClass> referencedClass) {
  if (!IsNull()) throw TZEPException(kZEPStatusInvalidOpSequence);
  fReferencedClass = std::move(referencedClass);
}

// ---- Conversions ----

// The data, after the checks that every conversion makes.
TCIMValueImpl const& TCIMValue::DataAs(TCIMType required) const {
  if (IsNull()) throw TZEPException(kZEPStatusValueIsNULL);
  if (fType != required) throw TZEPException(kZEPStatusTypeMismatch);
  return *fData;
}

TCIMValue::operator bool() const { return DataAs(TType::kCIMTypeBoolean).operator bool(); }
TCIMValue::operator unsigned char() const { return DataAs(TType::kCIMTypeUint8).operator unsigned char(); }
TCIMValue::operator signed char() const { return DataAs(TType::kCIMTypeSint8).operator signed char(); }
TCIMValue::operator unsigned short() const { return DataAs(TType::kCIMTypeUint16).operator unsigned short(); }
TCIMValue::operator short() const { return DataAs(TType::kCIMTypeSint16).operator short(); }
TCIMValue::operator unsigned int() const { return DataAs(TType::kCIMTypeUint32).operator unsigned int(); }
TCIMValue::operator int() const { return DataAs(TType::kCIMTypeSint32).operator int(); }
TCIMValue::operator unsigned long() const { return DataAs(TType::kCIMTypeUint64).operator unsigned long(); }
TCIMValue::operator long() const { return DataAs(TType::kCIMTypeSint64).operator long(); }
TCIMValue::operator float() const { return DataAs(TType::kCIMTypeReal32).operator float(); }
TCIMValue::operator double() const { return DataAs(TType::kCIMTypeReal64).operator double(); }
TCIMValue::operator std::string() const { return DataAs(TType::kCIMTypeString).operator std::string(); }
TCIMValue::operator TCIMDateTime() const { return DataAs(TType::kCIMTypeDateTime).operator TCIMDateTime(); }
TCIMValue::operator TCIMReference() const { return DataAs(TType::kCIMTypeReference).operator TCIMReference(); }

TCIMValue::operator std::vector<TCIMValue>&() const {
  return DataAs(ArrayOf(fType)).operator std::vector<TCIMValue>&();  // accepts an array of any type
}

std::string TCIMValue::ToString(unsigned char radix) const {
  if (IsNull()) throw TZEPException(kZEPStatusValueIsNULL);
  return fData->ToString(radix);
}

// ---- Comparisons ----

bool TCIMValue::operator==(TCIMValue const& other) const {
  if (IsNull() != other.IsNull() || fType != other.fType) return false;
  if (!IsNull()) return *fData == other;
  if (IsReference()) return fReferencedClass == other.fReferencedClass;
  if (IsArray()) return fMaxArraySize == other.fMaxArraySize;
  return true;
}

bool TCIMValue::operator<(TCIMValue const& other) const {
  if (IsNull() || other.IsNull()) return IsNull() && !other.IsNull();
  if (fType == other.fType) return *fData < other;
  return fType < other.fType;
}

}  // namespace NQRVZEP20
