// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <charconv>
#include <cstdint>
#include <cstring>

namespace NQRVZEP20 {

// Integers as text. Each function writes a number to `place` and returns the end of the text. It may write a few bytes
// beyond that end, but at most kRoomForInteger bytes in total, and for numbers of at most 32 bits at most kRoomForShort.
//
// Digits are written eight at a time, directly to their final place: composing the text from smaller pieces and then copying
// it takes twice as long.

constexpr std::size_t kRoomForInteger = 32;
constexpr std::size_t kRoomForShort = 15;

// The characters of eight digits, the first one in the lowest byte: the order that text has in memory.
using TEightDigits = std::uint64_t;

constexpr TEightDigits kEightZeros = 0x3030303030303030;

inline char* PutEight(char* place, TEightDigits digits) {
  std::memcpy(place, &digits, sizeof digits);
  return place + sizeof digits;
}

// The values (0 to 9) of the eight decimal digits of a number below 100000000. Each step splits every group of digits into
// two halves.
inline TEightDigits DecimalValues(std::uint32_t number) {
  std::uint64_t const fours = number / 10000 | std::uint64_t(number % 10000) << 32;
  std::uint64_t const hundreds = (fours * 10486 >> 20) & 0x0000007F0000007F;  // each group divided by 100
  std::uint64_t const twos = hundreds | (fours - hundreds * 100) << 16;
  std::uint64_t const tens = (twos * 103 >> 10) & 0x000F000F000F000F;  // each group divided by 10
  return tens | (twos - tens * 10) << 8;
}

inline char* PutDecimalBelowHundredMillion(char* place, std::uint32_t number) {
  TEightDigits const values = DecimalValues(number);
  int const leadingZeros = __builtin_ctzl(values | std::uint64_t(1) << 56) / 8;
  PutEight(place, (values + kEightZeros) >> 8 * leadingZeros);
  return place + 8 - leadingZeros;
}

inline char* PutDecimal(char* place, unsigned long number) {
  constexpr unsigned long kHundredMillion = 100000000;
  if (number < kHundredMillion) return PutDecimalBelowHundredMillion(place, static_cast<std::uint32_t>(number));
  if (number / kHundredMillion >= kHundredMillion) return std::to_chars(place, place + kRoomForInteger, number).ptr;
  place = PutDecimalBelowHundredMillion(place, static_cast<std::uint32_t>(number / kHundredMillion));
  return PutEight(place, kEightZeros + DecimalValues(static_cast<std::uint32_t>(number % kHundredMillion)));
}

inline char* PutDecimal(char* place, long number) {
  *place = '-';
  return number < 0 ? PutDecimal(place + 1, 0 - static_cast<unsigned long>(number))
                    : PutDecimal(place, static_cast<unsigned long>(number));
}

// Without padding.
inline char* PutOctal(char* place, unsigned long number) { return std::to_chars(place, place + kRoomForInteger, number, 8).ptr; }

// All eight digits, in capitals.
inline TEightDigits HexDigits(std::uint32_t number) {
  std::uint64_t values = number;
  values = (values | values << 16) & 0x0000FFFF0000FFFF;
  values = (values | values << 8) & 0x00FF00FF00FF00FF;
  values = (values | values << 4) & 0x0F0F0F0F0F0F0F0F;
  std::uint64_t const letters = (values + 0x0606060606060606) >> 4 & 0x0101010101010101;  // 1 where the digit is a letter
  return __builtin_bswap64(kEightZeros + values + letters * ('A' - '0' - 10));
}

// In capitals, padded with zeros to the width of the type. Writes nothing beyond the returned end.
template <class TUnsigned>
char* PutHex(char* place, TUnsigned number) {
  if constexpr (sizeof number > 4) place = PutEight(place, HexDigits(static_cast<std::uint32_t>(number >> 32)));
  constexpr std::size_t kDigits = sizeof number < 4 ? 2 * sizeof number : 8;
  TEightDigits const digits = HexDigits(static_cast<std::uint32_t>(number)) >> (64 - 8 * kDigits);
  std::memcpy(place, &digits, kDigits);
  return place + kDigits;
}

}  // namespace NQRVZEP20
