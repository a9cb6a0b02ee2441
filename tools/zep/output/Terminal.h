// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <cstddef>
#include <string_view>

namespace NQRVZEP20::zep {

// The layout of text for people.
enum class ELayout {
  kFile,      // it does not go to a terminal: columns have their fixed widths
  kTerminal,  // lines as wide as the terminal
  kPlain      // TERM is "dumb": a row of a table is one line, however long
};

ELayout OutputLayout();  // of standard output
ELayout ErrorsLayout();  // of standard error

// The width of a line on standard output, in columns: that of the terminal, from COLUMNS or the system, otherwise 80. With kPlain
// there is no limit.
std::size_t OutputWidth();

// Whether a line on standard error can be overwritten: standard error is a terminal, and TERM is not "dumb".
bool CanRedrawErrors();

// The number in the text of COLUMNS; 0 when it is not a number from 20 to 1000.
std::size_t ColumnsFrom(std::string_view text);

}  // namespace NQRVZEP20::zep
