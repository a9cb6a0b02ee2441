// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "providers/mof/TMofError.h"

#include <string>
#include <string_view>

namespace NQRVZEP20 {

// The contents of quoted literals. Escape sequences: \b \t \n \f \r \" \' \\ and \x with one to four hexadecimal digits.

// Appends the contents of a string literal, which is given with its quotes, as UTF-8. Throws TMofError for an unknown escape.
void AppendUnescaped(std::string& text, TMofSpan const& literal);

// The code of a character literal, given with its quotes: 'a', '\x0041'. Throws TMofError unless it is one character of 16 bits.
unsigned short CharacterOf(TMofSpan const& literal);

// The text escaped for use between double quotes, on one line.
std::string Escaped(std::string_view text);
std::string EscapedCharacter(unsigned short code);  // 'a' with its quotes

}  // namespace NQRVZEP20
