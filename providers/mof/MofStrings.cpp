// SPDX-License-Identifier: Apache-2.0
#include "providers/mof/MofStrings.h"

#include <algorithm>
#include <charconv>
#include <cstdint>
#include <cstdio>

namespace NQRVZEP20 {

namespace {

constexpr std::string_view kEscapes = "btnfr\"'\\";
constexpr std::string_view kEscaped = "\b\t\n\f\r\"'\\";

std::string_view WithoutQuotes(std::string_view literal) { return literal.substr(1, literal.size() - 2); }

bool IsSurrogate(unsigned int code) { return code >= 0xd800 && code < 0xe000; }

void AppendUtf8(std::string& text, unsigned int code) {
  if (code < 0x80) {
    text += static_cast<char>(code);
  } else if (code < 0x800) {
    text += static_cast<char>(0xc0 | code >> 6);
    text += static_cast<char>(0x80 | (code & 0x3f));
  } else {
    text += static_cast<char>(0xe0 | code >> 12);
    text += static_cast<char>(0x80 | (code >> 6 & 0x3f));
    text += static_cast<char>(0x80 | (code & 0x3f));
  }
}

// Removes the escape sequence at the start of `rest` and returns its code. `span`: the literal.
unsigned int TakeEscape(std::string_view& rest, TMofSpan const& span) {
  std::string_view const start = rest;
  rest.remove_prefix(2);  // the lexer leaves no backslash at the end
  if (start[1] == 'x' || start[1] == 'X') {
    unsigned int code = 0;
    char const* const end = rest.data() + std::min<std::size_t>(rest.size(), 4);
    char const* const stop = std::from_chars(rest.data(), end, code, 16).ptr;
    if (stop == rest.data()) throw TMofError({span.fFile, start}, "expected one to four hexadecimal digits after \"\\x\"");
    rest.remove_prefix(static_cast<std::size_t>(stop - rest.data()));
    return code;
  }
  std::size_t const escape = kEscapes.find(start[1]);
  if (escape == kEscapes.npos) throw TMofError({span.fFile, start}, "unknown escape sequence");
  return static_cast<unsigned char>(kEscaped[escape]);
}

// Removes the UTF-8 character of one to three bytes at the start of `rest` and returns its code; above 0xffff for anything else.
unsigned int TakeCharacter(std::string_view& rest) {
  auto const byte = [&rest](std::size_t at) { return static_cast<unsigned char>(rest[at]); };
  std::size_t const size = byte(0) < 0x80 ? 1 : byte(0) < 0xe0 ? 2 : 3;
  if (rest.size() < size || (byte(0) >= 0x80 && byte(0) < 0xc2) || byte(0) >= 0xf0) return 0x10000;
  unsigned int code = size == 1 ? byte(0) : byte(0) & (size == 2 ? 0x1f : 0x0f);
  for (std::size_t at = 1; at < size; ++at) {
    if ((byte(at) & 0xc0) != 0x80) return 0x10000;
    code = code << 6 | (byte(at) & 0x3f);
  }
  rest.remove_prefix(size);
  return code;
}

std::string HexadecimalEscape(unsigned int code) {
  char text[8];
  return std::string(text, static_cast<std::size_t>(std::snprintf(text, sizeof text, "\\x%04X", code & 0xffff)));
}

}  // namespace

void AppendUnescaped(std::string& text, TMofSpan const& literal) {
  std::string_view rest = WithoutQuotes(literal.fText);
  text.reserve(text.size() + rest.size());
  for (std::size_t backslash; (backslash = rest.find('\\')) != rest.npos;) {
    text.append(rest.substr(0, backslash));
    rest.remove_prefix(backslash);
    std::string_view const escape = rest;
    unsigned int const code = TakeEscape(rest, literal);
    if (IsSurrogate(code)) throw TMofError({literal.fFile, escape}, "half of a surrogate pair is not a character");
    AppendUtf8(text, code);
  }
  text.append(rest);
}

unsigned short CharacterOf(TMofSpan const& literal) {
  std::string_view rest = WithoutQuotes(literal.fText);
  unsigned int code = 0x10000;
  if (!rest.empty()) code = rest.front() == '\\' ? TakeEscape(rest, literal) : TakeCharacter(rest);
  if (code > 0xffff || !rest.empty()) throw TMofError(literal, "expected one character of 16 bits between the quotes");
  return static_cast<unsigned short>(code);
}

std::string Escaped(std::string_view text) {
  std::string escaped;
  escaped.reserve(text.size() + 16);
  for (char const c : text) {
    std::size_t const at = c == '\'' ? kEscaped.npos : kEscaped.find(c);
    if (at != kEscaped.npos) {
      escaped += '\\';
      escaped += kEscapes[at];
    } else if (static_cast<unsigned char>(c) < 0x20 || c == 0x7f)
      escaped += HexadecimalEscape(static_cast<unsigned char>(c));
    else
      escaped += c;
  }
  return escaped;
}

std::string EscapedCharacter(unsigned short code) {
  bool const isPlain = code >= 0x20 && code < 0x7f && code != '\'' && code != '\\';
  return "'" + (isPlain ? std::string(1, static_cast<char>(code)) : HexadecimalEscape(code)) + "'";
}

}  // namespace NQRVZEP20
