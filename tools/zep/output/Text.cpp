// SPDX-License-Identifier: Apache-2.0
#include "tools/zep/output/Text.h"

#include <algorithm>
#include <cmath>
#include <iterator>
#include <numeric>
#include <optional>

namespace NQRVZEP20::zep {

namespace {

std::string WithoutTrailingBlanks(std::string_view text) { return std::string(text.substr(0, text.find_last_not_of(' ') + 1)); }

// Stops at the first character that is too many, because the text may be long.
bool IsWiderThan(std::string_view text, std::size_t width) {
  std::size_t characters = 0;
  for (char const c : text)
    if ((static_cast<unsigned char>(c) & 0xc0) != 0x80 && ++characters > width) return true;
  return false;
}

// The place to break a text that is wider than `width`: the last blank that leaves a line of at most `width`, otherwise within
// the word.
std::size_t BreakOf(std::string_view text, std::size_t width) {
  std::size_t end = 0;
  for (std::size_t characters = 0; characters < width; ++characters)
    end += std::max<std::size_t>(FirstCharacterOf(text.substr(end)).fSize, 1);
  std::size_t const blank = text.find_last_of(' ', end);
  return blank != text.npos && text.find_first_not_of(' ') < blank ? blank : end;
}

// ---- Columns ----

constexpr std::size_t kGap = 2;               // between two columns
constexpr std::size_t kLeastColumnWidth = 6;  // of a column whose words are broken

using TWidths = std::vector<std::size_t>;

// Leading blanks belong to the first word.
std::size_t LongestWordIn(std::string_view cell) {
  std::size_t longest = 0, start = 0;
  std::size_t word = std::min(cell.find_first_not_of(' '), cell.size());
  while (start < cell.size()) {
    std::size_t const end = std::min(cell.find(' ', word), cell.size());
    longest = std::max(longest, WidthOf(cell.substr(start, end - start)));
    start = word = std::min(cell.find_first_not_of(' ', end), cell.size());
  }
  return longest;
}

// A number and its unit, such as "11.8 GiB", which stay on one line.
bool IsQuantity(std::string_view cell) {
  constexpr std::size_t longest = 20;
  constexpr char const* digits = "0123456789.";
  std::size_t const end = cell.find_first_not_of(digits);
  if (cell.size() > longest || end == 0 || end == cell.npos || cell[end] != ' ') return false;
  return cell.find_first_of(digits, end) == cell.npos && cell.find(' ', end + 1) == cell.npos;
}

std::size_t LongestPartOf(std::string_view cell) { return IsQuantity(cell) ? WidthOf(cell) : LongestWordIn(cell); }

std::size_t LineWidthOf(TWidths const& widths) {
  return std::accumulate(widths.begin(), widths.end(), kGap * (widths.size() - 1));
}

// The column in which `more` exceeds `less` by the largest amount; none when it exceeds it nowhere.
std::optional<std::size_t> WidestDifference(TWidths const& more, TWidths const& less) {
  std::optional<std::size_t> widest;
  for (std::size_t at = 0; at < more.size(); ++at)
    if (more[at] > less[at] && (!widest || more[at] - less[at] > more[*widest] - less[*widest])) widest = at;
  return widest;
}

void Narrow(TWidths& widths, TWidths const& needed, std::size_t lineWidth) {
  while (LineWidthOf(widths) > lineWidth) {
    auto const column = WidestDifference(widths, needed);
    if (!column) return;
    --widths[*column];
  }
}

void Widen(TWidths& widths, TWidths const& wanted, std::size_t lineWidth) {
  while (LineWidthOf(widths) < lineWidth) {
    auto const column = WidestDifference(wanted, widths);
    if (!column) return;
    ++widths[*column];
  }
}

}  // namespace

std::size_t WidthOf(std::string_view text) {
  return static_cast<std::size_t>(
      std::count_if(text.begin(), text.end(), [](char c) { return (static_cast<unsigned char>(c) & 0xc0) != 0x80; }));
}

std::vector<std::string> Wrapped(std::string_view text, std::size_t width) {
  std::vector<std::string> lines;
  while (IsWiderThan(text, width)) {
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
  auto size = static_cast<double>(bytes);
  std::size_t unit = 0;
  for (; unit + 1 < std::size(units) && size >= 1023.95; ++unit) size /= 1024;  // 1023.95 and more would be rounded to 1024
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
  std::vector<std::string> row;
  for (std::string const& cell : cells) row.push_back(Printable(cell));
  fRows.push_back(std::move(row));
}

std::vector<std::size_t> TTable::WidthsFor(ELayout layout, std::size_t lineWidth) const {
  TWidths needed(fWidths.size()), whole(fWidths.size()), least(fWidths.size(), kLeastColumnWidth);
  for (auto const& row : fRows)
    for (std::size_t at = 0; at < row.size(); ++at) {
      // A word of more than three quarters of the line is cut instead.
      std::size_t const longest = LongestPartOf(row[at]);
      if (longest <= lineWidth / 4 * 3) needed[at] = std::max(needed[at], longest);
      if (IsQuantity(row[at])) least[at] = std::max(least[at], longest);
      whole[at] = std::max(whole[at], WidthOf(row[at]));
    }
  if (layout == ELayout::kPlain) return whole;

  TWidths widths = fWidths;
  for (std::size_t at = 0; at < widths.size(); ++at) widths[at] = std::max(widths[at], needed[at]);
  Narrow(widths, needed, lineWidth);
  if (fNarrow == ENarrowTable::kBreaksWords) Narrow(widths, least, lineWidth);
  if (layout == ELayout::kTerminal) Widen(widths, whole, lineWidth);
  return widths;
}

std::string TTable::TextFor(ELayout layout, std::size_t lineWidth) const {
  TWidths const widths = WidthsFor(layout, lineWidth);
  std::string text;
  for (auto const& row : fRows) {
    std::vector<std::vector<std::string>> cells;
    std::size_t height = 0;
    for (std::size_t at = 0; at < row.size(); ++at) {
      cells.push_back(Wrapped(row[at], widths[at]));
      height = std::max(height, cells.back().size());
    }
    for (std::size_t number = 0; number < height; ++number) {
      std::string line;
      std::size_t column = 0;  // where the next cell begins
      for (std::size_t at = 0; at < cells.size(); ++at) {
        std::string const cell = number < cells[at].size() ? cells[at][number] : "";
        if (!cell.empty()) line.append(column - WidthOf(line), ' ').append(cell);
        column += widths[at] + kGap;
      }
      text += line + "\n";
    }
  }
  return text;
}

}  // namespace NQRVZEP20::zep
