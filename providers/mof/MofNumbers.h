// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "providers/mof/MofTree.h"

#include <string>
#include <string_view>

namespace NQRVZEP20 {

// A number as a value of that type: decimal, 0x1F, 017, 101b, or, for reals, with a point and an exponent. Throws TMofError,
// which points at `place`, when it is no number, does not fit the type, or the type is none of numbers or char16.
TCIMValue ReadMofNumber(std::string_view text, TCIMValue::TCIMType type, TMofPlace const& place);

// With every digit that the number needs to be read back as the same one. Throws kZEPStatusNotSupported when it is not
// finite.
std::string MofRealText(float number);
std::string MofRealText(double number);

}  // namespace NQRVZEP20
