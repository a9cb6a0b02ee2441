// SPDX-License-Identifier: Apache-2.0
#include "TStoredValue.h"

#include "CIMTypes.h"

#include <algorithm>
#include <cstring>
#include <limits>
#include <string>
#include <vector>

namespace NQRVZEP20 {

namespace {

using TType = TCIMValue::TCIMType;
using TLength = std::uint32_t;

// Calls `function` with a zero of the C++ type of a boolean, integer or real type; returns false for any other type.
template <class TFunction>
bool OnNumberType(TType type, TFunction const& function) {
  switch (type) {
    case TType::kCIMTypeBoolean:
      return function(false), true;
    case TType::kCIMTypeUint8:
      return function(static_cast<unsigned char>(0)), true;
    case TType::kCIMTypeSint8:
      return function(static_cast<signed char>(0)), true;
    case TType::kCIMTypeUint16:
      return function(static_cast<unsigned short>(0)), true;
    case TType::kCIMTypeSint16:
      return function(static_cast<short>(0)), true;
    case TType::kCIMTypeUint32:
      return function(0u), true;
    case TType::kCIMTypeSint32:
      return function(0), true;
    case TType::kCIMTypeUint64:
      return function(0ul), true;
    case TType::kCIMTypeSint64:
      return function(0l), true;
    case TType::kCIMTypeReal32:
      return function(0.0f), true;
    case TType::kCIMTypeReal64:
      return function(0.0), true;
    default:
      return false;
  }
}

bool IsNumberType(TType type) { return type >= TType::kCIMTypeBoolean && type <= TType::kCIMTypeReal64; }

bool IsNullOfNoClass(TCIMValue const& value) {
  return value.IsNull() && (BaseTypeOf(value.GetType()) != TType::kCIMTypeReference || !value.GetReferencedClass());
}

// ---- Numbers ----

// The bytes of the number are the first bytes of the result.
std::uint64_t BitsOf(TCIMValue const& number) {
  std::uint64_t bits = 0;
  OnNumberType(number.GetType(), [&](auto zero) {
    decltype(zero) const value = number;
    std::memcpy(&bits, &value, sizeof value);
  });
  return bits;
}

TCIMValue NumberOf(TType type, std::uint64_t bits) {
  TCIMValue number;
  OnNumberType(type, [&](auto value) {
    std::memcpy(&value, &bits, sizeof value);
    number = TCIMValue(value);
  });
  return number;
}

// ---- Strings and arrays in a block of memory. A string is its length and its text, an array its count and its elements. ----

template <class T>
char* Put(char* place, T const& number) {
  std::memcpy(place, &number, sizeof number);
  return place + sizeof number;
}

char* PutText(char* place, std::string const& text) {
  place = Put(place, static_cast<TLength>(text.size()));
  return place + text.copy(place, text.size());
}

template <class T>
T Next(char const*& place) {
  T number;
  std::memcpy(&number, place, sizeof number);
  place += sizeof number;
  return number;
}

std::string NextText(char const*& place) {
  auto const length = Next<TLength>(place);
  std::string const text(place, length);
  place += length;
  return text;
}

bool IsShort(std::size_t size) { return size <= std::numeric_limits<TLength>::max(); }

// Null when the text is too long for a block.
std::unique_ptr<char[]> BlockOfText(std::string const& text) {
  if (!IsShort(text.size())) return nullptr;
  std::unique_ptr<char[]> block(new char[sizeof(TLength) + text.size()]);
  PutText(block.get(), text);
  return block;
}

std::unique_ptr<char[]> BlockOfTexts(std::vector<TCIMValue> const& elements) {
  std::vector<std::string> const texts(elements.begin(), elements.end());
  std::size_t size = sizeof(TLength);
  for (std::string const& text : texts) size += sizeof(TLength) + text.size();
  if (!IsShort(size)) return nullptr;
  std::unique_ptr<char[]> block(new char[size]);
  char* place = Put(block.get(), static_cast<TLength>(texts.size()));
  for (std::string const& text : texts) place = PutText(place, text);
  return block;
}

std::unique_ptr<char[]> BlockOfNumbers(std::vector<TCIMValue> const& elements) {
  if (!IsShort(elements.size())) return nullptr;
  std::unique_ptr<char[]> block(new char[sizeof(TLength) + sizeof(std::uint64_t) * elements.size()]);
  char* place = Put(block.get(), static_cast<TLength>(elements.size()));
  for (TCIMValue const& element : elements) place = Put(place, BitsOf(element));
  return block;
}

// Null when an element is NULL or not of the declared type, which a caller may have put there, or when a block cannot hold them.
std::unique_ptr<char[]> BlockOfArray(TType type, std::vector<TCIMValue> const& elements) {
  bool const areAllOfType = std::all_of(elements.begin(), elements.end(), [type](TCIMValue const& element) {
    return !element.IsNull() && element.GetType() == type && element.GetMaxArraySize() == 0;
  });
  if (!areAllOfType) return nullptr;
  if (IsNumberType(type)) return BlockOfNumbers(elements);
  return type == TType::kCIMTypeString ? BlockOfTexts(elements) : nullptr;
}

std::vector<TCIMValue> ElementsOf(TType type, char const* block) {
  auto const count = Next<TLength>(block);
  std::vector<TCIMValue> elements;
  elements.reserve(count);
  while (elements.size() < count)
    elements.push_back(IsNumberType(type) ? NumberOf(type, Next<std::uint64_t>(block)) : TCIMValue(NextText(block)));
  return elements;
}

}  // namespace

TStoredValue::TStoredValue(TCIMValue const& value) : fType(value.GetType()), fMaxArraySize(value.GetMaxArraySize()) {
  bool const isArray = IsArrayType(fType);
  bool const isPlain = isArray || fMaxArraySize == 0;
  if (isPlain && IsNullOfNoClass(value)) return;
  if (isPlain && !value.IsNull() && IsNumberType(fType)) {
    fData = BitsOf(value);
    return;
  }
  std::unique_ptr<char[]> block;
  if (isPlain && !value.IsNull() && isArray) block = BlockOfArray(BaseTypeOf(fType), value.operator std::vector<TCIMValue>&());
  if (isPlain && !value.IsNull() && fType == TType::kCIMTypeString) block = BlockOfText(value);
  if (block)
    fData = std::move(block);
  else
    fData = std::make_unique<TCIMValue>(value);
}

TCIMValue TStoredValue::Get() const {
  if (auto const* const value = std::get_if<std::unique_ptr<TCIMValue>>(&fData)) return **value;
  if (auto const* const bits = std::get_if<std::uint64_t>(&fData)) return NumberOf(fType, *bits);
  if (auto const* const block = std::get_if<TBlock>(&fData)) {
    char const* place = block->get();
    if (!IsArrayType(fType)) return TCIMValue(NextText(place));
    return TCIMValue(BaseTypeOf(fType), fMaxArraySize, ElementsOf(BaseTypeOf(fType), place));
  }
  TCIMValue null;
  null.SetNullValue(fType, fMaxArraySize);
  return null;
}

bool TStoredValue::IsFalse() const {
  auto const* const bits = std::get_if<std::uint64_t>(&fData);
  return fType == TType::kCIMTypeBoolean && bits && *bits == 0;
}

}  // namespace NQRVZEP20
