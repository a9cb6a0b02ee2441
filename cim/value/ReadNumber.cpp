// SPDX-License-Identifier: Apache-2.0
#include "cim/value/ReadNumber.h"

#include <charconv>
#include <limits>
#include <locale>
#include <sstream>
#include <type_traits>

namespace NQRVZEP20 {
namespace {

bool IsBlank(char c) { return c == ' ' || (c >= '\t' && c <= '\r'); }
bool IsDigit(char c) { return c >= '0' && c <= '9'; }

std::string_view WithoutLeadingBlanks(std::string_view text) {
  std::size_t blanks = 0;
  while (blanks < text.size() && IsBlank(text[blanks])) ++blanks;
  return text.substr(blanks);
}

// Removes a leading sign from `text` and returns whether it was a minus.
bool TakeSign(std::string_view& text) {
  if (text.empty() || (text[0] != '+' && text[0] != '-')) return false;
  bool const negative = text[0] == '-';
  text.remove_prefix(1);
  return negative;
}

template <class TInteger>
TInteger ReadInteger(std::string_view text) {
  text = WithoutLeadingBlanks(text);
  bool const negative = TakeSign(text);

  std::make_unsigned_t<TInteger> magnitude = 0;
  if (std::from_chars(text.data(), text.data() + text.size(), magnitude).ec != std::errc()) return 0;
  if (std::is_signed_v<TInteger> && magnitude > static_cast<unsigned long>(std::numeric_limits<TInteger>::max()) + negative)
    return 0;
  return static_cast<TInteger>(negative ? 0 - magnitude : magnitude);
}

// The leading characters of `text` that can belong to a real: digits, a point, an exponent with its sign. They need not form
// a number: the result may be "." or "1e".
std::string_view TakeReal(std::string_view text) {
  bool hasDigits = false, hasPoint = false, hasExponent = false;
  std::size_t i = 0;
  for (; i < text.size(); ++i) {
    if (IsDigit(text[i])) {
      hasDigits = true;
    } else if (text[i] == '.' && !hasPoint && !hasExponent) {
      hasPoint = true;
    } else if ((text[i] == 'e' || text[i] == 'E') && hasDigits && !hasExponent) {
      hasExponent = true;
      if (i + 1 < text.size() && (text[i + 1] == '+' || text[i + 1] == '-')) ++i;
    } else {
      break;
    }
  }
  return text.substr(0, i);
}

// Reads a real that is too large or too small for its type. std::from_chars does not distinguish the two; a stream does: it
// fails for a number that is too large, and reads one that is too small as a zero with its sign.
template <class TReal>
TReal ReadExtremeReal(std::string_view text) {
  std::istringstream stream{std::string(text)};
  stream.imbue(std::locale::classic());
  TReal number = 0;
  return stream >> number ? number : 0;
}

// Reads a real of which std::from_chars accepts too much ("inf") or too little ("1e", which is not a number for a stream).
template <class TReal>
TReal ReadUnusualReal(std::string_view text, std::string_view digits, bool negative) {
  digits = TakeReal(digits);
  TReal magnitude = 0;
  char const* const end = digits.data() + digits.size();
  auto const read = std::from_chars(digits.data(), end, magnitude);
  if (read.ec == std::errc::invalid_argument || read.ptr != end) return 0;
  if (read.ec == std::errc::result_out_of_range) return ReadExtremeReal<TReal>(text);
  return negative ? -magnitude : magnitude;
}

template <class TReal>
TReal ReadReal(std::string_view text) {
  std::string_view digits = WithoutLeadingBlanks(text);
  bool const negative = TakeSign(digits);
  if (digits.empty() || !IsDigit(digits[0])) return ReadUnusualReal<TReal>(text, digits, negative);

  TReal magnitude = 0;
  char const* const end = digits.data() + digits.size();
  auto const read = std::from_chars(digits.data(), end, magnitude);
  bool const isWhole = read.ptr == end || (*read.ptr != 'e' && *read.ptr != 'E');
  if (read.ec != std::errc() || !isWhole) return ReadUnusualReal<TReal>(text, digits, negative);
  return negative ? -magnitude : magnitude;
}

bool ReadBoolean(std::string_view text) { return WithoutLeadingBlanks(text).substr(0, 4) == "true"; }

}  // namespace

template <class TNumber>
TNumber ReadNumber(std::string_view text) {
  if constexpr (std::is_same_v<TNumber, bool>)
    return ReadBoolean(text);
  else if constexpr (std::is_floating_point_v<TNumber>)
    return ReadReal<TNumber>(text);
  else
    return ReadInteger<TNumber>(text);
}

template bool ReadNumber(std::string_view);
template unsigned short ReadNumber(std::string_view);
template short ReadNumber(std::string_view);
template unsigned int ReadNumber(std::string_view);
template int ReadNumber(std::string_view);
template unsigned long ReadNumber(std::string_view);
template long ReadNumber(std::string_view);
template float ReadNumber(std::string_view);
template double ReadNumber(std::string_view);

}  // namespace NQRVZEP20
