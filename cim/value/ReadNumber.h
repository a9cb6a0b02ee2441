#pragma once

#include <string_view>

namespace NQRVZEP20 {

// The number that `text` begins with, behind white space, as a standard stream in the classic locale reads it, whatever the
// process's locale is. Reading stops at the first character that cannot go on with the number. Where there is none, or
// where it does not fit the type, the result is 0 (false). A negative number read as an unsigned one wraps around. A
// boolean is the word "true" or "false".
template <class TNumber>
TNumber ReadNumber(std::string_view text);

}  // namespace NQRVZEP20
