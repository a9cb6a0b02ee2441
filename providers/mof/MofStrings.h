// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "providers/mof/TMofError.h"

#include <string>
#include <string_view>

namespace NQRVZEP20 {

// The inside of quoted literals: \b \t \n \f \r \" \' \\ and \x with one to four hexadecimal digits.

// Appends what a string literal, given with its quotes, stands for, in UTF-8. Throws TMofError for an unknown escape.
void AppendUnescaped(std::string& text, TMofPlace const& literal);

// The code of a character literal, given with its quotes: 'a', '\x0041'. Throws TMofError unless it is one character of 16 bits.
unsigned short CharacterOf(TMofPlace const& literal);

// The text as it stands between double quotes, in one line.
std::string Escaped(std::string_view text);
std::string EscapedCharacter(unsigned short code);  // 'a' with its quotes

}  // namespace NQRVZEP20
