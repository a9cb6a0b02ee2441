// SPDX-License-Identifier: Apache-2.0
#include "TStoredValue.h"

#include "CIMTypes.h"

#include <algorithm>
#include <cstdint>
#include <cstring>
#include <limits>
#include <string>
#include <vector>

namespace NQRVZEP20 {

namespace {

using TType = TCIMValue::TCIMType;
using TLength = std::uint32_t;

bool IsNullOfNoClass(TCIMValue const& value) {
  return value.IsNull() && (BaseTypeOf(value.GetType()) != TType::kCIMTypeReference || !value.GetReferencedClass());
}

// The strings of a string or of an array of strings.
std::vector<std::string> StringsOf(TCIMValue const& value) {
  if (!IsArrayType(value.GetType())) return {value.operator std::string()};
  std::vector<std::string> strings;
  for (TCIMValue const& element : value.operator std::vector<TCIMValue>&()) strings.push_back(element);
  return strings;
}

bool IsOfStrings(TCIMValue const& value) {
  if (value.IsNull() || BaseTypeOf(value.GetType()) != TType::kCIMTypeString) return false;
  if (!IsArrayType(value.GetType())) return true;
  std::vector<TCIMValue> const& elements = value;
  return std::none_of(elements.begin(), elements.end(), [](TCIMValue const& element) { return element.IsNull(); });
}

std::unique_ptr<char[]> Packed(std::vector<std::string> const& strings) {
  std::size_t size = sizeof(TLength);
  for (std::string const& text : strings) size += sizeof(TLength) + text.size();
  std::unique_ptr<char[]> packed(new char[size]);
  char* at = packed.get();
  auto const count = static_cast<TLength>(strings.size());
  std::memcpy(at, &count, sizeof count);
  at += sizeof count;
  for (std::string const& text : strings) {
    auto const length = static_cast<TLength>(text.size());
    std::memcpy(at, &length, sizeof length);
    std::memcpy(at + sizeof length, text.data(), length);
    at += sizeof length + length;
  }
  return packed;
}

bool AreShort(std::vector<std::string> const& strings) {
  constexpr std::size_t kMost = std::numeric_limits<TLength>::max();
  return strings.size() <= kMost &&
         std::all_of(strings.begin(), strings.end(), [](std::string const& text) { return text.size() <= kMost; });
}

TLength NumberAt(char const* packed) {
  TLength number;
  std::memcpy(&number, packed, sizeof number);
  return number;
}

std::string NextOf(char const*& packed) {
  TLength const length = NumberAt(packed);
  std::string const text(packed + sizeof length, length);
  packed += sizeof length + length;
  return text;
}

}  // namespace

TStoredValue::TStoredValue(TCIMValue const& value) : fType(value.GetType()), fMaxArraySize(value.GetMaxArraySize()) {
  bool const isPlain = IsArrayType(fType) || fMaxArraySize == 0;
  if (isPlain && IsNullOfNoClass(value)) return;
  if (isPlain && fType == TType::kCIMTypeBoolean && !value.IsNull()) {
    fData = static_cast<bool>(value);
    return;
  }
  if (isPlain && IsOfStrings(value)) {
    std::vector<std::string> const strings = StringsOf(value);
    if (AreShort(strings)) {
      fData = Packed(strings);
      return;
    }
  }
  fData = std::make_unique<TCIMValue>(value);
}

TCIMValue TStoredValue::Get() const {
  if (auto const* const value = std::get_if<std::unique_ptr<TCIMValue>>(&fData)) return **value;
  if (bool const* const boolean = std::get_if<bool>(&fData)) return TCIMValue(*boolean);
  auto const* const strings = std::get_if<TStrings>(&fData);
  if (!strings) {
    TCIMValue null;
    null.SetNullValue(fType, fMaxArraySize);
    return null;
  }
  char const* at = strings->get() + sizeof(TLength);
  if (!IsArrayType(fType)) return TCIMValue(NextOf(at));
  std::vector<TCIMValue> elements;
  TLength const count = NumberAt(strings->get());
  elements.reserve(count);
  while (elements.size() < count) elements.emplace_back(NextOf(at));
  return TCIMValue(BaseTypeOf(fType), fMaxArraySize, elements);
}

bool TStoredValue::IsFalse() const {
  bool const* const boolean = std::get_if<bool>(&fData);
  return boolean && !*boolean;
}

}  // namespace NQRVZEP20
