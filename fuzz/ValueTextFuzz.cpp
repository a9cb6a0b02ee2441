// SPDX-License-Identifier: Apache-2.0

// Reads any text as a value of every type. A number must be the one that a standard stream in the classic locale reads (0
// when the stream fails), and every value must print, copy and compare as its type promises.

#include "TCIMReference.h"
#include "TCIMValue.h"
#include "TZEPException.h"
#include "fuzz/Require.h"

#include <cstdint>
#include <cstring>
#include <ios>
#include <locale>
#include <sstream>
#include <string>

namespace {

using NQRVZEP20::TCIMValue;
using NQRVZEP20::TZEPException;
using TType = TCIMValue::TCIMType;

template <class TNumber>
TNumber Extracted(std::string const& text) {
  std::istringstream stream(text);
  stream.imbue(std::locale::classic());
  TNumber number{};
  stream >> std::boolalpha >> number;
  return stream ? number : TNumber{};
}

template <class TStored, class TRead = TStored>
void CompareWithStream(TType type, std::string& text) {
  auto const expected = static_cast<TStored>(Extracted<TRead>(text));
  auto const actual = TCIMValue(type, text, nullptr).operator TStored();
  // NOLINTNEXTLINE(bugprone-suspicious-memory-comparison): also the sign of zero must be the same
  Require(std::memcmp(&expected, &actual, sizeof expected) == 0);
}

void CompareEachTypeWithStream(std::string& text) {
  CompareWithStream<bool>(TType::kCIMTypeBoolean, text);
  CompareWithStream<unsigned char, unsigned int>(TType::kCIMTypeUint8, text);
  CompareWithStream<signed char, int>(TType::kCIMTypeSint8, text);
  CompareWithStream<unsigned short>(TType::kCIMTypeUint16, text);
  CompareWithStream<short>(TType::kCIMTypeSint16, text);
  CompareWithStream<unsigned int>(TType::kCIMTypeUint32, text);
  CompareWithStream<int>(TType::kCIMTypeSint32, text);
  CompareWithStream<unsigned long>(TType::kCIMTypeUint64, text);
  CompareWithStream<long>(TType::kCIMTypeSint64, text);
  CompareWithStream<float>(TType::kCIMTypeReal32, text);
  CompareWithStream<double>(TType::kCIMTypeReal64, text);
}

// The printed text of a real must be the one that a stream prints, with six digits.
void CompareRealTextWithStream(std::string& text) {
  TCIMValue const value(TType::kCIMTypeReal64, text, nullptr);
  std::ostringstream stream;
  stream.imbue(std::locale::classic());
  stream << value.operator double();
  Require(value.ToString() == stream.str());
}

void TryEachType(std::string& text) {
  for (int type = TType::kCIMTypeInvalid; type <= TType::kCIMTypeArrayFlag + 1; ++type) {
    try {
      TCIMValue const value(TType(TType::ECIMType(type)), text, nullptr);
      TCIMValue const copy(value);  // NOLINT(performance-unnecessary-copy-initialization): the copy is the subject
      Require(copy.GetType() == type && !copy.IsNull());
      Require(copy.ToString() == value.ToString());
      Require(copy == value && !(copy != value));
    } catch (TZEPException const&) {
      Require(type == TType::kCIMTypeInvalid || type >= TType::kCIMTypeChar16);  // numbers and booleans never throw
    }
  }
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(std::uint8_t const* data, std::size_t size) {
  std::string text(reinterpret_cast<char const*>(data), size);
  std::string const before = text;
  CompareEachTypeWithStream(text);
  CompareRealTextWithStream(text);
  TryEachType(text);
  Require(text == before);
  return 0;
}
