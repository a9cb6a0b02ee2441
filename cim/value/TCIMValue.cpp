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

namespace {

// The kinds that are stored inside a value.
template <class TKind>
constexpr bool kIsInPlace = std::is_same_v<TKind, TCIMNumericValueImpl> || std::is_same_v<TKind, TCIMStringValueImpl>;

}  // namespace

// The data of a value that is NULL until now.
template <class TKind, class TSource>
TCIMValueImpl* TCIMValue::NewData(TSource const& source) {
  static_assert(!kIsInPlace<TKind> || (sizeof(TKind) <= sizeof fPlace && alignof(TKind) <= alignof(void*)));
  if constexpr (kIsInPlace<TKind>)
    return new (fPlace) TKind(source);
  else
    return std::make_unique<TKind>(source).release();
}

// `data`: of a value of this type.
TCIMValueImpl* TCIMValue::NewCopyOf(TCIMValueImpl const& data) {
  if (IsNumber()) return NewData<TCIMNumericValueImpl>(static_cast<TCIMNumericValueImpl const&>(data));
  if (IsArray()) return NewData<TCIMArrayValueImpl>(static_cast<TCIMArrayValueImpl const&>(data));
  return OnScalarType(fType, [&](auto scalar) {
    using TKind = typename decltype(scalar)::TKind;
    return NewData<TKind>(static_cast<TKind const&>(data));
  });
}

bool TCIMValue::IsInPlace() const noexcept { return static_cast<void const*>(fData) == fPlace; }

// A number needs no destruction.
void TCIMValue::DestroyData() noexcept {
  if (!IsInPlace())
    delete fData;
  else if (fType == TType::kCIMTypeString)
    static_cast<TCIMStringValueImpl*>(fData)->TCIMStringValueImpl::~TCIMStringValueImpl();
  fData = nullptr;
}

// Takes over the tag and the data of another value, which must not be part of this one's data, and leaves it NULL with tag 0.
void TCIMValue::TakeData(TCIMValue&& other) noexcept {
  DestroyData();
  fType = other.fType;
  if (!other.IsInPlace())
    fData = std::exchange(other.fData, nullptr);
  else if (fType == TType::kCIMTypeString)
    fData = new (fPlace) TCIMStringValueImpl(std::move(static_cast<TCIMStringValueImpl&>(*other.fData)));
  else
    fData = new (fPlace) TCIMNumericValueImpl(static_cast<TCIMNumericValueImpl&>(*other.fData));
  other.DestroyData();
  other.fType = TType::kCIMTypeInvalid;
}

// ---- Construction ----

TCIMValue::TCIMValue() noexcept : fType(TType::kCIMTypeInvalid) {}

TCIMValue::TCIMValue(TCIMType type, unsigned int arraySize)
    : fType(arraySize != 0 ? ArrayOf(type) : type), fMaxArraySize(arraySize) {}

TCIMValue::TCIMValue(bool value) : fType(TType::kCIMTypeBoolean), fData(NewData<TCIMNumericValueImpl>(value)) {}
TCIMValue::TCIMValue(unsigned char value) : fType(TType::kCIMTypeUint8), fData(NewData<TCIMNumericValueImpl>(value)) {}
TCIMValue::TCIMValue(signed char value) : fType(TType::kCIMTypeSint8), fData(NewData<TCIMNumericValueImpl>(value)) {}
TCIMValue::TCIMValue(unsigned short value) : fType(TType::kCIMTypeUint16), fData(NewData<TCIMNumericValueImpl>(value)) {}
TCIMValue::TCIMValue(short value) : fType(TType::kCIMTypeSint16), fData(NewData<TCIMNumericValueImpl>(value)) {}
TCIMValue::TCIMValue(unsigned int value) : fType(TType::kCIMTypeUint32), fData(NewData<TCIMNumericValueImpl>(value)) {}
TCIMValue::TCIMValue(int value) : fType(TType::kCIMTypeSint32), fData(NewData<TCIMNumericValueImpl>(value)) {}
TCIMValue::TCIMValue(unsigned long value) : fType(TType::kCIMTypeUint64), fData(NewData<TCIMNumericValueImpl>(value)) {}
TCIMValue::TCIMValue(long value) : fType(TType::kCIMTypeSint64), fData(NewData<TCIMNumericValueImpl>(value)) {}
TCIMValue::TCIMValue(float value) : fType(TType::kCIMTypeReal32), fData(NewData<TCIMNumericValueImpl>(value)) {}
TCIMValue::TCIMValue(double value) : fType(TType::kCIMTypeReal64), fData(NewData<TCIMNumericValueImpl>(value)) {}
TCIMValue::TCIMValue(TCIMChar16 const& value) : fType(TType::kCIMTypeChar16), fData(NewData<TCIMChar16ValueImpl>(value)) {}
TCIMValue::TCIMValue(char const* value) : fType(TType::kCIMTypeString), fData(NewData<TCIMStringValueImpl>(value)) {}
TCIMValue::TCIMValue(std::string const& value) : fType(TType::kCIMTypeString), fData(NewData<TCIMStringValueImpl>(value)) {}

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
      fData = NewData<TCIMNumericValueImpl>(static_cast<TStorage>(ReadNumber<TRead>(text)));
    } else {
      Set(static_cast<TStorage const&>(text));
    }
  });
}

TCIMValue::TCIMValue(TCIMValue const& other) : fType(other.fType), fMaxArraySize(other.IsArray() ? other.fMaxArraySize : 0) {
  if (IsReference()) fReferencedClass = other.fReferencedClass;
  if (!other.IsNull()) fData = NewCopyOf(*other.fData);
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
