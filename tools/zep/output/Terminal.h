// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <cstddef>
#include <string_view>

namespace NQRVZEP20::zep {

// How text for people is laid out where it goes.
enum class ELayout {
  kFile,      // standard output is not a terminal: lines as wide as the columns ask for
  kTerminal,  // lines as wide as the terminal
  kPlain      // TERM is "dumb": a row of a table is one line, however long
};

ELayout OutputLayout();

// How many columns a line on standard output has: those of the terminal, as COLUMNS or the system tells them, else 80. With
// kPlain there is no limit.
std::size_t OutputWidth();

// Whether a line can be written over and over on standard error: it is a terminal, and not a dumb one.
bool CanRedrawErrors();

// The number that COLUMNS has; 0 when it is not a number from 20 to 1000.
std::size_t ColumnsFrom(std::string_view text);

}  // namespace NQRVZEP20::zep
