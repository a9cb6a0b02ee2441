#include "Text.h"

#include <algorithm>
#include <cmath>
#include <cstdio>
#include <iterator>

namespace NQRVZEP20::zep {

namespace {

struct TCharacter {
  std::uint32_t code;
  std::size_t size;  // in bytes; 0 for a byte that begins no UTF-8 character
};

// The character that the text, which is not empty, begins with.
TCharacter FirstOf(std::string_view text) {
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

// Characters that a terminal acts upon, or that show text other than it is.
bool IsHarmful(std::uint32_t code) {
  bool const isControl = code < 0x20 || (code >= 0x7f && code < 0xa0);
  bool const isDirection = code == 0x061c || (code >= 0x200b && code <= 0x200f) || (code >= 0x2028 && code <= 0x202e) ||
                           (code >= 0x2060 && code <= 0x206f) || code == 0xfeff;
  return isControl || isDirection;
}

std::string Escaped(std::uint32_t code) {
  char text[12];
  std::snprintf(text, sizeof text, code < 0x100 ? "\\x%02x" : "\\u%04x", static_cast<unsigned>(code));
  return text;
}

// The text with those of its characters escaped that `isToBeEscaped`.
template <class TIsToBeEscaped>
std::string WithEscaped(std::string_view text, TIsToBeEscaped isToBeEscaped) {
  std::string escaped;
  while (!text.empty()) {
    TCharacter const first = FirstOf(text);
    std::size_t const size = std::max<std::size_t>(first.size, 1);
    if (isToBeEscaped(first))
      escaped += Escaped(first.code);
    else
      escaped += text.substr(0, size);
    text.remove_prefix(size);
  }
  return escaped;
}

std::string WithoutTrailingBlanks(std::string_view text) { return std::string(text.substr(0, text.find_last_not_of(' ') + 1)); }

// Where to break a text that is wider than `width`: behind that many characters, or at the last blank before.
std::size_t BreakOf(std::string_view text, std::size_t width) {
  std::size_t end = 0;
  for (std::size_t characters = 0; characters < width; ++characters)
    end += std::max<std::size_t>(FirstOf(text.substr(end)).size, 1);
  if (text[end] == ' ') return end;
  std::size_t const blank = text.substr(0, end).find_last_of(' ');
  return blank == std::string_view::npos || blank == 0 ? end : blank;
}

}  // namespace

std::string Printable(std::string_view text) {
  return WithEscaped(text, [](TCharacter const& character) { return character.size == 0 || IsHarmful(character.code); });
}

std::string WithBytesEscaped(std::string_view text) {
  return WithEscaped(text, [](TCharacter const& character) { return character.size == 0 || character.code == 0; });
}

std::size_t WidthOf(std::string_view text) {
  return static_cast<std::size_t>(
      std::count_if(text.begin(), text.end(), [](char c) { return (static_cast<unsigned char>(c) & 0xc0) != 0x80; }));
}

std::vector<std::string> Wrapped(std::string_view text, std::size_t width) {
  std::vector<std::string> lines;
  while (WidthOf(text) > width) {
    std::size_t const end = BreakOf(text, width);
    lines.push_back(WithoutTrailingBlanks(text.substr(0, end)));
    text.remove_prefix(end);
    text.remove_prefix(std::min(text.find_first_not_of(' '), text.size()));
  }
  if (!text.empty() || lines.empty()) lines.push_back(WithoutTrailingBlanks(text));
  return lines;
}

std::string Joined(std::vector<std::string> const& texts, std::string const& separator) {
  std::string joined;
  for (std::string const& text : texts) joined += (&text == &texts.front() ? "" : separator) + text;
  return joined;
}

std::string SizeText(std::uint64_t bytes) {
  constexpr char const* units[] = {"B", "KiB", "MiB", "GiB", "TiB"};
  double size = static_cast<double>(bytes);
  std::size_t unit = 0;
  for (; unit + 1 < std::size(units) && size >= 1023.95; ++unit) size /= 1024;  // what would be rounded to 1024
  long const tenths = std::lround(size * 10);
  std::string const digit = tenths % 10 == 0 ? "" : "." + std::to_string(tenths % 10);
  return std::to_string(tenths / 10) + digit + " " + units[unit];
}

std::string ExactSizeText(std::uint64_t bytes) {
  constexpr char const* units[] = {"bytes", "KiB", "MiB", "GiB", "TiB"};
  std::size_t unit = 0;
  for (; unit + 1 < std::size(units) && bytes >= 1024 && bytes % 1024 == 0; ++unit) bytes /= 1024;
  return std::to_string(bytes) + " " + units[unit];
}

void TTable::Add(std::vector<std::string> const& cells) {
  std::vector<std::vector<std::string>> columns;
  std::size_t height = 0;
  for (std::size_t at = 0; at < cells.size(); ++at) {
    columns.push_back(Wrapped(Printable(cells[at]), fWidths[at]));
    height = std::max(height, columns.back().size());
  }
  for (std::size_t row = 0; row < height; ++row) {
    std::string line;
    std::size_t column = 0;  // where the next cell begins
    for (std::size_t at = 0; at < columns.size(); ++at) {
      std::string const cell = row < columns[at].size() ? columns[at][row] : "";
      if (!cell.empty()) line.append(column - WidthOf(line), ' ').append(cell);
      column += fWidths[at] + 2;
    }
    fText += line + "\n";
  }
}

}  // namespace NQRVZEP20::zep
