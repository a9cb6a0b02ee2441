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
#include <utility>

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

// ---- The data ----

// The data of a value that is NULL until now, of a kind that is allocated on the heap.
template <class TKind, class TSource>
TCIMValueImpl* TCIMValue::NewData(TSource const& source) {
  return std::make_unique<TKind>(source).release();
}

// The rest of copying: values that are NULL, and those whose data are on the heap.
void TCIMValue::CopyOther(TCIMValue const& other) {
  if (IsArray()) fMaxArraySize = other.fMaxArraySize;
  if (IsReference()) fReferencedClass = other.fReferencedClass;
  if (other.IsNull()) return;
  if (IsArray())
    fData = NewData<TCIMArrayValueImpl>(static_cast<TCIMArrayValueImpl const&>(*other.fData));
  else
    fData = OnScalarType(fType, [&](auto scalar) -> TCIMValueImpl* {
      using TKind = typename decltype(scalar)::TKind;
      return NewData<TKind>(static_cast<TKind const&>(*other.fData));
    });
}

void TCIMValue::DestroyData() noexcept {
  if (HoldsString())
    String().TCIMStringValueImpl::~TCIMStringValueImpl();
  else if (!IsNumber())  // a number needs no destruction
    delete fData;
  fData = nullptr;
}

// Takes over the tag and the data of another value, which must not be part of this one's data, and leaves it NULL with tag 0.
void TCIMValue::TakeData(TCIMValue&& other) noexcept {
  DestroyData();
  fType = other.fType;
  if (other.HoldsNumber())
    fData = NewNumber(other.Number());
  else if (other.HoldsString())
    fData = NewString(std::move(static_cast<TCIMStringValueImpl&>(*other.fData)));
  else
    fData = std::exchange(other.fData, nullptr);
  other.DestroyData();
  other.fType = TType::kCIMTypeInvalid;
}

// ---- Construction ----

TCIMValue::TCIMValue(TCIMType type, unsigned int arraySize)
    : fType(arraySize != 0 ? ArrayOf(type) : type), fMaxArraySize(arraySize) {}

TCIMValue::TCIMValue(TCIMChar16 const& value) : fType(TType::kCIMTypeChar16), fData(NewData<TCIMChar16ValueImpl>(value)) {}

TCIMValue::TCIMValue(TCIMDateTime const& value) : fType(TType::kCIMTypeDateTime), fData(NewData<TCIMDateTimeValueImpl>(value)) {}

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
      fType = type;
      fData = NewNumber(static_cast<TStorage>(ReadNumber<TRead>(text)));
    } else {
      Set(static_cast<TStorage const&>(text));
    }
  });
}

TCIMValue::TCIMValue(TCIMValue&& other) noexcept : TCIMValue() { TakeFrom(std::move(other)); }

// ---- Assignment ----

TCIMValue& TCIMValue::operator=(TCIMValue const& other) {  // NOLINT(bugprone-unhandled-self-assignment): Set handles it
  Set(other);
  return *this;
}

TCIMValue& TCIMValue::operator=(TCIMValue&& other) {
  if (*this == other) return *this;
  TakeFrom(TCIMValue(std::move(other)));  // `other` may be an element of this value, destroyed with the old data
  return *this;
}

void TCIMValue::Set(TCIMValue const& other) {
  if (!(*this == other)) TakeFrom(TCIMValue(other));
}

// Takes over the tag and the data, the maximum array size of an array and the referenced class of a reference. Leaves
// `other`, which must not be part of this value's data, in the default state.
void TCIMValue::TakeFrom(TCIMValue&& other) noexcept {
  unsigned int const maxArraySize = std::exchange(other.fMaxArraySize, 0);
  boost::shared_ptr<ICIMClass> referencedClass = std::move(other.fReferencedClass);
  TakeData(std::move(other));
  if (IsArray()) fMaxArraySize = maxArraySize;
  if (IsReference()) fReferencedClass = std::move(referencedClass);
}

void TCIMValue::SetNullValue(TCIMType::ECIMType type, unsigned int arraySize) {
  TakeData(TCIMValue(type, 0));
  if (IsArray()) fMaxArraySize = arraySize;
}

void TCIMValue::Set(bool value) { TakeData(TCIMValue(value)); }
void TCIMValue::Set(unsigned char value) { TakeData(TCIMValue(value)); }
void TCIMValue::Set(signed char value) { TakeData(TCIMValue(value)); }
void TCIMValue::Set(unsigned short value) { TakeData(TCIMValue(value)); }
void TCIMValue::Set(short value) { TakeData(TCIMValue(value)); }
void TCIMValue::Set(unsigned int value) { TakeData(TCIMValue(value)); }
void TCIMValue::Set(int value) { TakeData(TCIMValue(value)); }
void TCIMValue::Set(unsigned long value) { TakeData(TCIMValue(value)); }
void TCIMValue::Set(long value) { TakeData(TCIMValue(value)); }
void TCIMValue::Set(float value) { TakeData(TCIMValue(value)); }
void TCIMValue::Set(double value) { TakeData(TCIMValue(value)); }
void TCIMValue::Set(TCIMChar16 const& value) { TakeData(TCIMValue(value)); }
void TCIMValue::Set(char const* value) { TakeData(TCIMValue(value)); }
void TCIMValue::Set(std::string const& value) { TakeData(TCIMValue(value)); }
void TCIMValue::Set(TCIMDateTime const& value) { TakeData(TCIMValue(value)); }

void TCIMValue::Set(TCIMReference& value) {
  TCIMValue reference;
  reference.fType = TType::kCIMTypeReference;
  reference.fData = reference.NewData<TCIMReferenceValueImpl>(value);
  TakeData(std::move(reference));
  fReferencedClass = value.GetClass();
}

void TCIMValue::Set(TCIMType type, unsigned int maxArraySize, std::vector<TCIMValue> const& elements) {
  TCIMValue array;
  array.fType = ArrayOf(type);
  array.fData = array.NewData<TCIMArrayValueImpl>(elements);
  TakeData(std::move(array));
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
  if (IsNull() || fType != required) Refuse();
  return *fData;
}

void TCIMValue::Refuse() const { throw TZEPException(IsNull() ? kZEPStatusValueIsNULL : kZEPStatusTypeMismatch); }

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

// The rest of ==: two values with the same tag, both NULL or both with data on the heap.
bool TCIMValue::EqualsOther(TCIMValue const& other) const {
  if (!IsNull()) return *fData == other;
  if (IsReference()) return fReferencedClass == other.fReferencedClass;
  if (IsArray()) return fMaxArraySize == other.fMaxArraySize;
  return true;
}

// The rest of <: any values but two strings.
bool TCIMValue::IsLessThanOther(TCIMValue const& other) const {
  if (IsNull() || other.IsNull()) return IsNull() && !other.IsNull();
  if (fType == other.fType) return *fData < other;
  return fType < other.fType;
}

}  // namespace NQRVZEP20
