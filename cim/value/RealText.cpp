// SPDX-License-Identifier: Apache-2.0
#include "cim/value/RealText.h"

#include "cim/value/IntegerText.h"

#include <array>
#include <charconv>
#include <cmath>
#include <cstdint>
#include <cstdlib>
#include <cstring>

namespace NQRVZEP20 {
namespace {

// SixDigitsOf handles the numbers in this range, for which 128 bits and the powers of five up to 5^27 are enough.
constexpr double kLeastExact = 1e-21;
constexpr double kBeyondExact = 1e22;

__extension__ typedef unsigned __int128 TUint128;

constexpr std::array<std::uint64_t, 28> PowersOfFive() {
  std::array<std::uint64_t, 28> powers{1};
  for (std::size_t i = 1; i < powers.size(); ++i) powers[i] = 5 * powers[i - 1];
  return powers;
}
constexpr auto kPowersOfFive = PowersOfFive();

// The integral part of a number, and whether the fraction rounds it up; a half rounds to the even neighbour.
struct TSplit {
  unsigned int fWhole;
  bool fRoundsUp;
};

template <class TUnsigned>
TSplit SplitBy(unsigned int whole, TUnsigned rest, TUnsigned half) {
  return {whole, rest > half || (rest == half && whole % 2 != 0)};
}

// mantissa * 2^exponent * 10^power, exactly.
TSplit Scale(std::uint64_t mantissa, int exponent, int power) {
  int const shift = exponent + power;  // the power of two: 10^power is 2^power * 5^power
  if (power >= 0) {
    TUint128 const product = TUint128(mantissa) * kPowersOfFive[power];
    TUint128 const one = TUint128(1) << -shift;
    return SplitBy(static_cast<unsigned int>(product >> -shift), product & (one - 1), one / 2);
  }
  std::uint64_t dividend = 2 * mantissa, divisor = 2 * kPowersOfFive[-power];  // doubled: half of it is an integer
  shift >= 0 ? dividend <<= shift : divisor <<= -shift;
  return SplitBy(static_cast<unsigned int>(dividend / divisor), dividend % divisor, divisor / 2);
}

// The number fDigits * 10^(fExponent - 5), where fDigits is 100000 to 999999.
struct TSixDigits {
  unsigned int fDigits;
  int fExponent;
};

// `number` is at least kLeastExact and less than kBeyondExact.
TSixDigits SixDigitsOf(double number) {
  std::uint64_t bits;
  std::memcpy(&bits, &number, sizeof bits);
  std::uint64_t const mantissa = (bits & 0xFFFFFFFFFFFFF) | 0x10000000000000;
  int const exponent = static_cast<int>(bits >> 52) - 1075;

  int decimal = ((exponent + 52) * 1233) >> 12;  // the decimal exponent, or one less: 1233 / 4096 is about log10(2)
  TSplit split = Scale(mantissa, exponent, 5 - decimal);
  if (split.fWhole >= 1000000) split = Scale(mantissa, exponent, 5 - ++decimal);

  unsigned int const digits = split.fWhole + split.fRoundsUp;
  return digits < 1000000 ? TSixDigits{digits, decimal} : TSixDigits{100000, decimal + 1};
}

char* PutCharacters(char* place, char const* characters, int count) {
  for (int i = 0; i < count; ++i) *place++ = characters[i];
  return place;
}

char* PutExponent(char* place, int exponent) {
  int const magnitude = std::abs(exponent);
  *place++ = 'e';
  *place++ = exponent < 0 ? '-' : '+';
  *place++ = static_cast<char>('0' + magnitude / 10);
  *place++ = static_cast<char>('0' + magnitude % 10);
  return place;
}

char* PutSixDigits(char* place, TSixDigits number) {
  TEightDigits const values = DecimalValues(number.fDigits * 100);
  int const count = 8 - __builtin_clzl(values) / 8;  // without trailing zeros
  char digits[8];
  PutEight(digits, values + kEightZeros);

  if (number.fExponent < 0 && number.fExponent >= -4) {
    place = PutCharacters(place, "0.000", 1 - number.fExponent);
    return PutCharacters(place, digits, count);
  }
  bool const isFixed = number.fExponent >= 0 && number.fExponent < 6;
  int const whole = isFixed ? number.fExponent + 1 : 1;  // digits before the point
  place = PutCharacters(place, digits, whole);
  if (count > whole) *place++ = '.';
  place = PutCharacters(place, digits + whole, count - whole);
  return isFixed ? place : PutExponent(place, number.fExponent);
}

}  // namespace

char* PutReal(char* place, double number) {
  double const magnitude = std::fabs(number);
  if (!(magnitude >= kLeastExact && magnitude < kBeyondExact))
    return std::to_chars(place, place + 13, number, std::chars_format::general, 6).ptr;
  if (number < 0) *place++ = '-';
  return PutSixDigits(place, SixDigitsOf(magnitude));
}

}  // namespace NQRVZEP20
