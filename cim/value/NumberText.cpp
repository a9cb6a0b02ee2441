#include "cim/value/NumberText.h"

#include <array>
#include <charconv>
#include <cmath>
#include <cstdint>
#include <cstring>

namespace NQRVZEP20 {
namespace {

constexpr std::size_t kInPlace = 15;  // what a std::string holds without allocating

// All pairs of digits in a base, one after the other: "000102...".
template <unsigned int base>
constexpr std::array<char, 2 * base * base> DigitPairs() {
  std::array<char, 2 * base * base> pairs{};
  for (unsigned int i = 0; i < base * base; ++i) {
    pairs[2 * i] = "0123456789ABCDEF"[i / base];
    pairs[2 * i + 1] = "0123456789ABCDEF"[i % base];
  }
  return pairs;
}
constexpr auto kDecimalPairs = DigitPairs<10>();
constexpr auto kHexPairs = DigitPairs<16>();

// A text of that length to be written over, in which every digit then has its place at once.
std::string Zeros(std::size_t length) {
  std::string text("000000000000000", kInPlace);
  if (length <= kInPlace)
    text.erase(length);
  else
    text.assign(length, '0');
  return text;
}

// ---- Integers ----

std::size_t CountDigits(unsigned long number) {
  for (std::size_t count = 1;; count += 4, number /= 10000) {
    if (number < 10) return count;
    if (number < 100) return count + 1;
    if (number < 1000) return count + 2;
    if (number < 10000) return count + 3;
  }
}

// Writes the digits of a number so that they end at `end`.
void PutDigits(char* end, unsigned long number) {
  for (; number >= 100; number /= 100) std::memcpy(end -= 2, &kDecimalPairs[2 * (number % 100)], 2);
  if (number >= 10)
    std::memcpy(end - 2, &kDecimalPairs[2 * number], 2);
  else
    end[-1] = static_cast<char>('0' + number);
}

// ---- Reals ----

// The range in which SixDigitsOf needs no more than 128 bits.
constexpr double kLeastExact = 1e-22;
constexpr double kBeyondExact = 1e22;

__extension__ typedef unsigned __int128 TUint128;

constexpr std::array<std::uint64_t, 28> PowersOfFive() {
  std::array<std::uint64_t, 28> powers{1};
  for (std::size_t i = 1; i < powers.size(); ++i) powers[i] = 5 * powers[i - 1];
  return powers;
}
constexpr auto kPowersOfFive = PowersOfFive();

// A number in two parts: its whole part, and whether the rest makes it round up, a half to the even neighbour.
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
  int const shift = exponent + power;  // the twos of the power of ten join the exponent, and its fives remain
  if (power >= 0) {
    TUint128 const product = TUint128(mantissa) * kPowersOfFive[power];
    TUint128 const one = TUint128(1) << -shift;
    return SplitBy(static_cast<unsigned int>(product >> -shift), product & (one - 1), one / 2);
  }
  std::uint64_t dividend = 2 * mantissa, divisor = 2 * kPowersOfFive[-power];  // doubled, so that half of it is whole
  shift >= 0 ? dividend <<= shift : divisor <<= -shift;
  return SplitBy(static_cast<unsigned int>(dividend / divisor), dividend % divisor, divisor / 2);
}

// A number as digits * 10^(exponent - 5), with digits from 100000 to 999999.
struct TSixDigits {
  unsigned int fDigits;
  int fExponent;
};

// `number` is from kLeastExact up to kBeyondExact.
TSixDigits SixDigitsOf(double number) {
  std::uint64_t bits;
  std::memcpy(&bits, &number, sizeof bits);
  std::uint64_t const mantissa = (bits & 0xFFFFFFFFFFFFF) | 0x10000000000000;
  int const exponent = static_cast<int>(bits >> 52) - 1075;

  int decimal = ((exponent + 52) * 1233) >> 12;  // the decimal exponent, or one less: 1233 / 4096 is the logarithm of 2
  TSplit split = Scale(mantissa, exponent, 5 - decimal);
  if (split.fWhole >= 1000000) split = Scale(mantissa, exponent, 5 - ++decimal);

  unsigned int const digits = split.fWhole + split.fRoundsUp;
  return digits < 1000000 ? TSixDigits{digits, decimal} : TSixDigits{100000, decimal + 1};
}

std::string GeneralText(bool negative, TSixDigits number) {
  char digits[6];
  std::memcpy(digits, &kDecimalPairs[2 * (number.fDigits / 10000)], 2);
  std::memcpy(digits + 2, &kDecimalPairs[2 * (number.fDigits / 100 % 100)], 2);
  std::memcpy(digits + 4, &kDecimalPairs[2 * (number.fDigits % 100)], 2);
  int count = 6;  // without trailing zeros
  while (count > 1 && digits[count - 1] == '0') --count;

  std::string text = Zeros(kInPlace);
  char* end = text.data();
  auto const put = [&](char const* from, int length) {
    for (int i = 0; i < length; ++i) *end++ = from[i];
  };

  if (negative) *end++ = '-';
  bool const isFixed = number.fExponent >= -4 && number.fExponent < 6;
  int const whole = isFixed ? number.fExponent + 1 : 1;  // digits before the point; none for 0.001
  if (whole <= 0) {
    put("0.000", 2 - whole);
    put(digits, count);
  } else {
    put(digits, whole);
    if (count > whole) *end++ = '.';
    put(digits + whole, count - whole);
  }
  if (!isFixed) {
    *end++ = 'e';
    *end++ = number.fExponent < 0 ? '-' : '+';
    put(&kDecimalPairs[2 * std::abs(number.fExponent)], 2);
  }
  text.erase(static_cast<std::size_t>(end - text.data()));
  return text;
}

}  // namespace

std::string DecimalText(unsigned long number) {
  std::string text = Zeros(CountDigits(number));
  PutDigits(text.data() + text.size(), number);
  return text;
}

std::string DecimalText(long number) {
  bool const negative = number < 0;
  unsigned long const magnitude = negative ? 0 - static_cast<unsigned long>(number) : static_cast<unsigned long>(number);
  std::string text = Zeros(negative + CountDigits(magnitude));
  PutDigits(text.data() + text.size(), magnitude);
  if (negative) text[0] = '-';
  return text;
}

std::string OctalText(unsigned long number) {
  std::size_t digits = 1;
  for (unsigned long rest = number; rest >= 8; rest /= 8) ++digits;
  std::string text = Zeros(digits);
  for (char* place = text.data() + digits; number != 0; number /= 8) *--place = static_cast<char>('0' + number % 8);
  return text;
}

std::string HexText(unsigned long number, unsigned int digits) {
  std::string text = Zeros(digits);
  for (char* place = text.data() + digits; place != text.data(); number >>= 8)
    std::memcpy(place -= 2, &kHexPairs[2 * (number & 0xFF)], 2);
  return text;
}

std::string RealText(double number) {
  double const magnitude = std::fabs(number);
  if (magnitude >= kLeastExact && magnitude < kBeyondExact) return GeneralText(number < 0, SixDigitsOf(magnitude));

  char buffer[16];  // "-2.22507e-308"
  char* const end = std::to_chars(buffer, buffer + sizeof buffer, number, std::chars_format::general, 6).ptr;
  return std::string(buffer, end);
}

}  // namespace NQRVZEP20
