// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "providers/mof/MofTree.h"

#include <string>
#include <string_view>

namespace NQRVZEP20 {

// A number as a value of that type: decimal, 0x1F, 017, 101b, or, for reals, with a point and an exponent. Throws TMofError at
// `span` when the text is not a number, the number does not fit the type, or the type is neither a number nor char16.
TCIMValue ReadMofNumber(std::string_view text, TCIMValue::TCIMType type, TMofSpan const& span);

// The shortest text that parses to the same number. Throws kZEPStatusNotSupported when the number is not finite.
std::string MofRealText(float number);
std::string MofRealText(double number);

}  // namespace NQRVZEP20
