// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <cstddef>
#include <string_view>

namespace NQRVZEP20::zep {

// The layout of text output.
enum class ELayout {
  kFile,      // the output is not a terminal: columns have fixed widths
  kTerminal,  // lines as wide as the terminal
  kPlain      // TERM is "dumb": each table row is one line of any length
};

ELayout OutputLayout();  // of standard output
ELayout ErrorsLayout();  // of standard error

// The line width of standard output in columns: that of the terminal, from COLUMNS or the system, otherwise 80. With kPlain it
// is unlimited.
std::size_t OutputWidth();

// Whether a line on standard error can be overwritten: standard error is a terminal, and TERM is not "dumb".
bool CanRedrawErrors();

// Parses the value of COLUMNS; returns 0 unless it is a number from 20 to 1000.
std::size_t ColumnsFrom(std::string_view text);

}  // namespace NQRVZEP20::zep
