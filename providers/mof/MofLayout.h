// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "TCIMValue.h"

#include <string>
#include <vector>

namespace NQRVZEP20 {

// How MOF is broken into lines of about 100 characters.

// Items between commas: in one line behind `column` characters if they fit, else in lines that begin with `indent` blanks.
std::string MofList(std::vector<std::string> const& items, std::size_t column, std::size_t indent);

// A value that stands behind `column` characters of its line. A long string becomes several, and a long array lines, which
// begin with `indent` blanks.
std::string MofValueText(TCIMValue const& value, std::size_t column, std::size_t indent);

}  // namespace NQRVZEP20
