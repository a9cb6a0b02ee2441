#pragma once

#include <string>
#include <string_view>

namespace NQRVZEP20 {

// Numbers to and from text, as a standard stream in the classic locale writes and reads them. The process's locale has no
// say.

// The text of a boolean, integer or real; `radix` is 10, 16 or 8. Base 16 is in capitals, filled with zeros to the width of
// the type. Throws kZEPStatusNotSupported for base 16 and 8 where the type has no such text: signed integers and reals.
template <class TNumber>
std::string TextOf(TNumber number, unsigned char radix);

// The number that `text` begins with, behind white space: reading stops at the first character that cannot go on with it.
// Where there is none, or where it does not fit the type, the result is 0 (false). A negative number read as an unsigned
// one wraps around. A boolean is the word "true" or "false".
template <class TNumber>
TNumber ReadNumber(std::string_view text);

}  // namespace NQRVZEP20
