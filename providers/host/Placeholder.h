// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "providers/reasons/TFinding.h"

#include <string>
#include <string_view>

namespace NQRVZEP20 {

// True for texts that firmware contains in place of a value: "To Be Filled By O.E.M.", "Default string", "0123456789", a row of
// one filler character, and the like. Case and surrounding blanks do not matter.
bool IsPlaceholder(std::string_view text);

// The machine's own name, as `uname` reports it. Missing when it is "(none)", which the kernel reports until a name is set. The
// placeholders of firmware are allowed: the name of a machine may be "default".
TFinding<std::string> HostNameOf(std::string const& nodeName);

// The text; missing when it is blank, a placeholder, or only bytes 0xFF, which flash memory contains until it is programmed.
TFinding<std::string> WithoutPlaceholder(std::string const& text);

}  // namespace NQRVZEP20
