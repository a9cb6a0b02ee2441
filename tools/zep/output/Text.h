// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "collect/SafeText.h"
#include "tools/zep/output/Terminal.h"

#include <cstdint>
#include <string>
#include <string_view>
#include <vector>

namespace NQRVZEP20::zep {

// The width of a printable text in columns: its number of characters.
std::size_t WidthOf(std::string_view text);

// Wraps the text into lines of at most `width` characters, at blanks if possible; returns at least one line. `width` must be at
// least 1.
std::vector<std::string> Wrapped(std::string_view text, std::size_t width);

// Joins the strings with the separator.
std::string Joined(std::vector<std::string> const& texts, std::string const& separator);

// A human-readable size, rounded to one decimal: "390.6 KiB", "4 MiB".
std::string SizeText(std::uint64_t bytes);

// An exact size, in the largest unit that divides it: "512 MiB", "1025 bytes".
std::string ExactSizeText(std::uint64_t bytes);

// How a table treats a line that is too short for its longest words.
enum class ENarrowTable {
  kLongLines,   // words stay whole, so that they can be copied; lines are then too long
  kBreaksWords  // lines keep the width; words of the widest columns are broken
};

// A table with a title line and columns separated by two blanks. A cell that is too long for its column is wrapped. A number with
// its unit stays on one line; a word that is longer than three quarters of a line is always broken. Cells are made printable
// (SafeText.h) by this class.
class TTable {
public:
  // `widths`: the widths of the columns on a line of 80, in characters.
  explicit TTable(std::vector<std::size_t> widths, ENarrowTable narrow = ENarrowTable::kLongLines)
      : fWidths(std::move(widths)), fNarrow(narrow) {}

  void Add(std::vector<std::string> const& cells);  // one cell per column
  bool IsEmpty() const { return fRows.empty(); }

  // The lines, laid out for standard output.
  std::string GetText() const { return TextFor(OutputLayout(), OutputWidth()); }

  // The same for the given line width. If a column would have to break words, other columns give up width that they do not
  // need; on a terminal, columns also use the rest of the line.
  std::string TextFor(ELayout layout, std::size_t lineWidth) const;

private:
  std::vector<std::size_t> WidthsFor(ELayout layout, std::size_t lineWidth) const;

  std::vector<std::size_t> fWidths;
  ENarrowTable fNarrow;
  std::vector<std::vector<std::string>> fRows;
};

}  // namespace NQRVZEP20::zep
