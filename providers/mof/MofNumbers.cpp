// SPDX-License-Identifier: Apache-2.0
#include "providers/mof/MofNumbers.h"

#include <charconv>
#include <cmath>
#include <cstdint>
#include <limits>
#include <type_traits>

namespace NQRVZEP20 {

namespace {

using TType = TCIMValue::TCIMType;

struct TInteger {
  bool fIsNegative;
  std::uint64_t fMagnitude;
};

[[noreturn]] void RefuseRange(TMofSpan const& span, TType type) {
  throw TMofError(span, "the number is out of the range of " + type.ToString());
}

bool TakeSign(std::string_view& digits) {
  bool const isNegative = digits.front() == '-';
  if (isNegative || digits.front() == '+') digits.remove_prefix(1);
  return isNegative;
}

// Removes the prefix or suffix that states the base.
int TakeBase(std::string_view& digits) {
  char const last = digits.empty() ? '0' : digits.back();
  bool const isHexadecimal = digits.size() > 2 && digits[0] == '0' && (digits[1] == 'x' || digits[1] == 'X');
  if (isHexadecimal) return digits.remove_prefix(2), 16;
  if (last == 'b' || last == 'B') return digits.remove_suffix(1), 2;
  return digits.size() > 1 && digits[0] == '0' ? 8 : 10;
}

TInteger ReadInteger(std::string_view digits, TType type, TMofSpan const& span) {
  TInteger integer{TakeSign(digits), 0};
  int const base = TakeBase(digits);
  auto const [end, error] = std::from_chars(digits.data(), digits.data() + digits.size(), integer.fMagnitude, base);
  if (error == std::errc::result_out_of_range) RefuseRange(span, type);
  if (error != std::errc() || end != digits.data() + digits.size()) throw TMofError(span, "expected an integer");
  return integer;
}

template <class T>
TCIMValue IntegerValue(std::string_view text, TType type, TMofSpan const& span) {
  TInteger const integer = ReadInteger(text, type, span);
  auto const greatest = static_cast<std::uint64_t>(std::numeric_limits<T>::max());
  std::uint64_t const greatestNegative = std::is_signed_v<T> ? greatest + 1 : 0;  // the greatest magnitude of a negative number
  if (integer.fMagnitude > (integer.fIsNegative ? greatestNegative : greatest)) RefuseRange(span, type);
  return TCIMValue(static_cast<T>(integer.fIsNegative ? 0 - integer.fMagnitude : integer.fMagnitude));
}

template <class T>
TCIMValue RealValue(std::string_view digits, TType type, TMofSpan const& span) {
  bool const isNegative = TakeSign(digits);
  T number = 0;
  auto const [end, error] = std::from_chars(digits.data(), digits.data() + digits.size(), number);
  if (error == std::errc::result_out_of_range) RefuseRange(span, type);
  if (error != std::errc() || end != digits.data() + digits.size()) throw TMofError(span, "expected a number");
  return TCIMValue(isNegative ? -number : number);
}

template <class T>
std::string RealText(T number) {
  if (!std::isfinite(number)) throw TZEPException(kZEPStatusNotSupported);
  char text[64];
  std::string digits(text, std::to_chars(text, text + sizeof text, number).ptr);
  if (digits.find('.') == digits.npos) digits.insert(std::min(digits.find('e'), digits.size()), ".0");
  return digits;
}

}  // namespace

TCIMValue ReadMofNumber(std::string_view text, TType type, TMofSpan const& span) {
  switch (type) {
    case TType::kCIMTypeUint8:
      return IntegerValue<unsigned char>(text, type, span);
    case TType::kCIMTypeSint8:
      return IntegerValue<signed char>(text, type, span);
    case TType::kCIMTypeUint16:
      return IntegerValue<unsigned short>(text, type, span);
    case TType::kCIMTypeSint16:
      return IntegerValue<short>(text, type, span);
    case TType::kCIMTypeUint32:
      return IntegerValue<unsigned int>(text, type, span);
    case TType::kCIMTypeSint32:
      return IntegerValue<int>(text, type, span);
    case TType::kCIMTypeUint64:
      return IntegerValue<unsigned long>(text, type, span);
    case TType::kCIMTypeSint64:
      return IntegerValue<long>(text, type, span);
    case TType::kCIMTypeReal32:
      return RealValue<float>(text, type, span);
    case TType::kCIMTypeReal64:
      return RealValue<double>(text, type, span);
    case TType::kCIMTypeChar16:
      return TCIMValue(TCIMChar16(IntegerValue<unsigned short>(text, TType::kCIMTypeUint16, span).operator unsigned short()));
    default:
      throw TMofError(span, "expected a value of the type " + type.ToString());
  }
}

std::string MofRealText(float number) { return RealText(number); }
std::string MofRealText(double number) { return RealText(number); }

}  // namespace NQRVZEP20
