// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "providers/reasons/TFinding.h"

#include <string>
#include <string_view>

namespace NQRVZEP20 {

// True for the texts that firmware makers leave in a field that nobody filled: "To Be Filled By O.E.M.", "Default string",
// "0123456789", a row of one filler character, and the like. Case and surrounding blanks do not matter.
bool IsPlaceholder(std::string_view text);

// The machine's own name, as `uname` gives it. Missing where it is "(none)", which the kernel gives until a name is set. The
// firmware's placeholders are not looked for: a machine may well be called "default".
TFinding<std::string> HostNameOf(std::string const& nodeName);

// The text; missing when it is blank, a placeholder, or only bytes 0xFF, which flash memory contains until it is programmed.
TFinding<std::string> WithoutPlaceholder(std::string const& text);

}  // namespace NQRVZEP20
