// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <string_view>

namespace NQRVZEP20 {

// The number at the start of `text`, after any white space, as a standard stream in the classic locale reads it, whatever
// the process's locale is. Reading stops at the first character that cannot continue the number. If there is no number, or
// it does not fit the type, the result is 0 (false). A negative number read as an unsigned type wraps around. A boolean is
// the word "true" or "false".
template <class TNumber>
TNumber ReadNumber(std::string_view text);

}  // namespace NQRVZEP20
