// SPDX-License-Identifier: Apache-2.0
#include "IpmiText.h"

namespace NQRVZEP20 {

namespace {

std::uint8_t ByteOf(char character) { return static_cast<std::uint8_t>(character); }

std::string BcdPlusText(std::string_view bytes) {
  constexpr char digits[] = "0123456789 -.:,_";
  std::string text;
  for (char const byte : bytes) (text += digits[ByteOf(byte) >> 4]) += digits[ByteOf(byte) & 0x0F];
  return text;
}

// Each three bytes are four characters, the first in the lowest bits.
std::string SixBitText(std::string_view bytes) {
  std::string text;
  unsigned bits = 0, count = 0;
  for (char const byte : bytes) {
    bits |= static_cast<unsigned>(ByteOf(byte)) << count;
    for (count += 8; count >= 6; count -= 6, bits >>= 6) text += static_cast<char>(' ' + (bits & 0x3F));
  }
  return text;
}

std::string Latin1Text(std::string_view bytes) {
  std::string text;
  for (char const byte : bytes) {
    std::uint8_t const code = ByteOf(byte);
    if (code < ' ' || (code >= 0x7F && code < 0xA0))
      text += '?';
    else if (code < 0x80)
      text += byte;
    else
      (text += static_cast<char>(0xC0 | code >> 6)) += static_cast<char>(0x80 | (code & 0x3F));
  }
  return text;
}

std::string Decoded(ETextForm form, std::string_view bytes) {
  switch (form) {
    case ETextForm::kBinary:
      return HexText(bytes);
    case ETextForm::kBcdPlus:
      return BcdPlusText(bytes);
    case ETextForm::kSixBit:
      return SixBitText(bytes);
    default:
      return Latin1Text(bytes.substr(0, bytes.find('\0')));
  }
}

}  // namespace

ETextForm TextFormOf(std::uint8_t typeAndLength) { return static_cast<ETextForm>(typeAndLength >> 6); }
std::size_t TextLengthOf(std::uint8_t typeAndLength) { return typeAndLength & 0x3F; }

TFinding<std::string> IpmiText(ETextForm form, std::string_view bytes) {
  std::string const text = Decoded(form, bytes);
  std::size_t const begin = text.find_first_not_of(' ');
  if (begin == std::string::npos) return TMissing{kMissingNotGiven, "the controller's data have no text here"};
  return text.substr(begin, text.find_last_not_of(' ') + 1 - begin);
}

std::string HexText(std::string_view bytes, char const* separator) {
  constexpr char digits[] = "0123456789abcdef";
  std::string text;
  for (char const byte : bytes) {
    if (!text.empty()) text += separator;
    (text += digits[ByteOf(byte) >> 4]) += digits[ByteOf(byte) & 0x0F];
  }
  return text;
}

}  // namespace NQRVZEP20
