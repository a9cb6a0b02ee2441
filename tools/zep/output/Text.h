// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "collect/SafeText.h"
#include "tools/zep/output/Terminal.h"

#include <cstdint>
#include <string>
#include <string_view>
#include <vector>

namespace NQRVZEP20::zep {

// How many characters a printable text has. Each counts as one column.
std::size_t WidthOf(std::string_view text);

// Lines of at most `width` characters, broken at blanks where that is possible; at least one line. `width` is at least 1.
std::vector<std::string> Wrapped(std::string_view text, std::size_t width);

// The texts with that between each two.
std::string Joined(std::vector<std::string> const& texts, std::string const& separator);

// A size for people, rounded to a tenth: "390.6 KiB", "4 MiB".
std::string SizeText(std::uint64_t bytes);

// A size to the byte, in the largest unit that it is a whole number of: "512 MiB", "1025 bytes".
std::string ExactSizeText(std::uint64_t bytes);

// A table with a title line and columns that are two blanks apart. A cell that is too long for its column goes on in the next
// line; no word is cut that takes up to three quarters of a line. Cells are made printable here, and passwords in
// them are hidden: a line that is broken in two hides none later.
class TTable {
public:
  // `widths`: those of the columns on a line of 80, in characters.
  explicit TTable(std::vector<std::size_t> widths) : fWidths(std::move(widths)) {}

  void Add(std::vector<std::string> const& cells);  // as many as there are columns
  bool IsEmpty() const { return fRows.empty(); }

  // The lines as standard output has room for them.
  std::string GetText() const { return TextFor(OutputLayout(), OutputWidth()); }

  // The same for a line of that width. Columns give what they do not need where words would be cut; on a terminal they also
  // take what the line still has.
  std::string TextFor(ELayout layout, std::size_t lineWidth) const;

private:
  std::vector<std::size_t> WidthsFor(ELayout layout, std::size_t lineWidth) const;

  std::vector<std::size_t> fWidths;
  std::vector<std::vector<std::string>> fRows;
};

}  // namespace NQRVZEP20::zep
