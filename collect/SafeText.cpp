// SPDX-License-Identifier: Apache-2.0
#include "collect/SafeText.h"

#include <algorithm>
#include <cstdio>

namespace NQRVZEP20 {

namespace {

// Characters that a terminal acts upon, or that show text other than it is, and codes that no text may contain.
bool IsHarmful(std::uint32_t code) {
  bool const isControl = code < 0x20 || (code >= 0x7f && code < 0xa0);
  bool const isDirection = code == 0x061c || (code >= 0x200b && code <= 0x200f) || (code >= 0x2028 && code <= 0x202e) ||
                           (code >= 0x2060 && code <= 0x206f) || code == 0xfeff;
  bool const isNoCharacter = (code >= 0xfdd0 && code <= 0xfdef) || (code & 0xfffe) == 0xfffe;  // by the Unicode standard
  return isControl || isDirection || isNoCharacter;
}

std::string Escaped(std::uint32_t code) {
  char text[12];
  std::snprintf(text, sizeof text, code < 0x100 ? "\\x%02x" : "\\u%04x", static_cast<unsigned>(code));
  return text;
}

// The text with those of its characters escaped for which `isToBeEscaped` returns true.
template <class TIsToBeEscaped>
std::string WithEscaped(std::string_view text, TIsToBeEscaped isToBeEscaped) {
  std::string escaped;
  escaped.reserve(4 * text.size());  // enough for "\\xff" each: a reallocation would leave a copy of a secret
  while (!text.empty()) {
    TCharacter const first = FirstCharacterOf(text);
    std::size_t const size = std::max<std::size_t>(first.fSize, 1);
    if (isToBeEscaped(first))
      escaped += Escaped(first.fCode);
    else
      escaped += text.substr(0, size);
    text.remove_prefix(size);
  }
  return escaped;
}

}  // namespace

TCharacter FirstCharacterOf(std::string_view text) {
  auto const byte = [&](std::size_t at) { return static_cast<unsigned char>(text[at]); };
  if (byte(0) < 0x80) return {byte(0), 1};
  std::size_t const size = byte(0) >= 0xf0 ? 4 : byte(0) >= 0xe0 ? 3 : 2;
  if (byte(0) < 0xc2 || byte(0) > 0xf4 || text.size() < size) return {byte(0), 0};

  std::uint32_t code = byte(0) & (0xff >> (size + 1));
  for (std::size_t at = 1; at < size; ++at) {
    if ((byte(at) & 0xc0) != 0x80) return {byte(0), 0};
    code = code << 6 | (byte(at) & 0x3f);
  }
  constexpr std::uint32_t smallest[] = {0, 0, 0x80, 0x800, 0x10000};
  bool const isSurrogate = code >= 0xd800 && code <= 0xdfff;
  if (code < smallest[size] || code > 0x10ffff || isSurrogate) return {byte(0), 0};
  return {code, size};
}

std::string Printable(std::string_view text) {
  return WithEscaped(text, [](TCharacter const& character) { return character.fSize == 0 || IsHarmful(character.fCode); });
}

std::string WithBytesEscaped(std::string_view text) {
  return WithEscaped(text, [](TCharacter const& character) { return character.fSize == 0 || character.fCode == 0; });
}

std::string Shortened(std::string_view text, std::size_t most) {
  if (text.size() <= most) return std::string(text);
  auto const isWithin = [](char byte) { return (static_cast<unsigned char>(byte) & 0xc0) == 0x80; };
  constexpr std::size_t kMostWithin = 3;  // bytes of a character after its first
  std::size_t const latest = most - 3;
  std::size_t end = latest;
  while (end > 0 && latest - end < kMostWithin && isWithin(text[end])) --end;
  if (isWithin(text[end])) end = latest;  // it is not UTF-8
  return std::string(text.substr(0, end)) + "...";
}

}  // namespace NQRVZEP20
