// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "TCIMValue.h"

#include <string>

namespace NQRVZEP20 {

// Converts the value to the type of `pattern` if nothing is lost, so that providers can write plain literals: a value of tag 0
// becomes a NULL of that type, an integer takes the declared width and sign if the number fits, and an array takes the declared
// maximum size. Any other value is returned unchanged.
TCIMValue FittedTo(TCIMValue const& pattern, TCIMValue const& value);

// Why a property of the type `declared` refuses the value, whose type is another one: "65536 is outside the range of uint16, 0 to
// 65535", or "the value is a string instead of a uint16". Does not repeat a text, which may be a password.
std::string WhyNotOf(TCIMValue::TCIMType declared, TCIMValue const& value);

}  // namespace NQRVZEP20
