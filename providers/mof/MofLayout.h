// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "TCIMValue.h"

#include <string>
#include <vector>

namespace NQRVZEP20 {

// Breaks MOF into lines of about 100 characters.

// Items separated by commas: on one line, after `column` characters, if they fit; otherwise on lines indented by `indent` blanks.
std::string MofList(std::vector<std::string> const& items, std::size_t column, std::size_t indent);

// A value that follows `column` characters of its line. A long string is split into several strings and a long array into
// several lines, which are indented by `indent` blanks.
std::string MofValueText(TCIMValue const& value, std::size_t column, std::size_t indent);

}  // namespace NQRVZEP20
