// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <string>

namespace NQRVZEP20 {

// A product name may contain the machine type and model in brackets: "Server Q100 -[1234AB7]-".

// Whether the name contains "-[" and, somewhere after it, "]".
bool HasBrackets(std::string const& productName);

// The name without the brackets and what follows them: "Server Q100". A name with nothing before its brackets is returned
// unchanged.
std::string WithoutBrackets(std::string const& productName);

}  // namespace NQRVZEP20
