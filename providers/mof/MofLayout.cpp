// SPDX-License-Identifier: Apache-2.0
#include "providers/mof/MofLayout.h"

#include "ICIMNamespace.h"
#include "providers/mof/MofStrings.h"
#include "providers/mof/MofValues.h"

#include <algorithm>

namespace NQRVZEP20 {

namespace {

constexpr std::size_t kWidth = 100;

std::string NewLine(std::size_t indent) { return "\n" + std::string(indent, ' '); }

bool IsInsideCharacter(char c) { return (static_cast<unsigned char>(c) & 0xc0) == 0x80; }

// The end of the next piece of the text: after its last blank or line end that fits, or else at the full width.
std::size_t EndOfPiece(std::string const& text, std::size_t start, std::size_t width) {
  std::size_t end = std::min(start + width, text.size());
  while (end > start && Escaped(std::string_view(text).substr(start, end - start)).size() > width) --end;
  if (end == text.size()) return end;
  std::size_t const blank = text.find_last_of(" \n", end - 1);
  if (blank != text.npos && blank >= start) return blank + 1;
  while (end > start + 1 && IsInsideCharacter(text[end])) --end;
  return end;
}

std::string StringText(std::string const& text, std::size_t column, std::size_t indent) {
  std::string const literal = "\"" + Escaped(text) + "\"";
  if (column + literal.size() <= kWidth) return literal;
  std::size_t const width = kWidth - std::min<std::size_t>(indent + 2, 60);
  std::string pieces;
  for (std::size_t start = 0; start < text.size();) {
    std::size_t const end = EndOfPiece(text, start, width);
    pieces += NewLine(indent) + "\"" + Escaped(std::string_view(text).substr(start, end - start)) + "\"";
    start = end;
  }
  return pieces;
}

}  // namespace

// An item of several lines begins on a line of its own, and so does the item after it.
std::string MofList(std::vector<std::string> const& items, std::size_t column, std::size_t indent) {
  std::string list;
  bool wasBroken = false;
  for (std::size_t at = 0; at < items.size(); ++at) {
    std::string const item = items[at] + (at + 1 < items.size() ? "," : "");
    bool const isBroken = item.find('\n') != item.npos;
    bool const fits = !isBroken && !wasBroken && column + 1 + item.size() <= kWidth;
    if (at > 0) list += fits ? " " : NewLine(indent);
    if (at > 0) column = fits ? column + 1 : indent;
    list += item;
    column += item.size();
    wasBroken = isBroken;
  }
  return list;
}

std::string MofValueText(TCIMValue const& value, std::size_t column, std::size_t indent) {
  if (value.IsNull()) return "NULL";
  if (value.GetType() == TCIMValue::TCIMType::kCIMTypeString) return StringText(value, column, indent);
  if (!value.IsArray()) return MofScalarText(value);
  std::vector<std::string> items;
  for (TCIMValue const& element : value.operator std::vector<TCIMValue>&())
    items.push_back(MofValueText(element, indent, indent));
  return "{" + MofList(items, column + 1, indent) + "}";
}

}  // namespace NQRVZEP20
