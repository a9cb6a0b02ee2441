// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "providers/reasons/TFinding.h"

#include <string>
#include <string_view>

namespace NQRVZEP20 {

// True for strings that firmware contains in place of a value: "To Be Filled By O.E.M.", "Default string", "0123456789", a row
// of one filler character, and the like. Case and surrounding blanks are ignored.
bool IsPlaceholder(std::string_view text);

// The machine's own name, as reported by `uname`. Missing if it is "(none)", which the kernel reports until a name is set.
// Firmware placeholders are accepted: a machine may be named "default".
TFinding<std::string> HostNameOf(std::string const& nodeName);

// The text, or missing if it is blank, a placeholder, or only bytes 0xFF, as in unprogrammed flash memory.
TFinding<std::string> WithoutPlaceholder(std::string const& text);

}  // namespace NQRVZEP20
