// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "collect/SafeText.h"
#include "tools/zep/output/Terminal.h"

#include <cstdint>
#include <string>
#include <string_view>
#include <vector>

namespace NQRVZEP20::zep {

// The number of characters of a printable text. Each counts as one column.
std::size_t WidthOf(std::string_view text);

// Lines of at most `width` characters, broken at blanks where that is possible; at least one line. `width` is at least 1.
std::vector<std::string> Wrapped(std::string_view text, std::size_t width);

// The texts, with the separator between each two.
std::string Joined(std::vector<std::string> const& texts, std::string const& separator);

// A size for people, rounded to a tenth: "390.6 KiB", "4 MiB".
std::string SizeText(std::uint64_t bytes);

// An exact size, in the largest unit that divides it: "512 MiB", "1025 bytes".
std::string ExactSizeText(std::uint64_t bytes);

// A table with a title line and columns that are two blanks apart. A cell that is too long for its column continues in the next
// line; only a word that is longer than three quarters of a line is cut. Cells are made printable here.
class TTable {
public:
  // `widths`: the widths of the columns on a line of 80, in characters.
  explicit TTable(std::vector<std::size_t> widths) : fWidths(std::move(widths)) {}

  void Add(std::vector<std::string> const& cells);  // as many as there are columns
  bool IsEmpty() const { return fRows.empty(); }

  // The lines, laid out for standard output.
  std::string GetText() const { return TextFor(OutputLayout(), OutputWidth()); }

  // The same for a line of that width. Where a column would have to cut words, others give up width that they do not need; on a
  // terminal, columns also take the rest of the line.
  std::string TextFor(ELayout layout, std::size_t lineWidth) const;

private:
  std::vector<std::size_t> WidthsFor(ELayout layout, std::size_t lineWidth) const;

  std::vector<std::size_t> fWidths;
  std::vector<std::vector<std::string>> fRows;
};

}  // namespace NQRVZEP20::zep
