// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <string>
#include <string_view>
#include <vector>

namespace NQRVZEP20 {

// The ways in which a value may be written in a text, besides its marks (TNormalText.h), the value itself first: without marks,
// as UTF-16, percent-encoded and in escapes such as "\x4a", where either the marks or all characters are encoded, and as
// hexadecimal digits of its characters, which may be in groups or numbers such as "0x4a". An IP address also as hexadecimal
// digits and as a name for reverse look-ups, a UUID also with its bytes in the other order, a name with dots also as
// "DC=example,DC=net".
std::vector<std::string> SpellingsOf(std::string_view value);

// The value in base64, in UTF-8 and UTF-16, alone and after one and two other bytes, without the characters that depend on its
// neighbours. None of fewer than six bytes, whose forms are common words.
std::vector<std::string> Base64Of(std::string_view value);

// A text that is the same for all spellings of the same value: of a MAC or IPv6 address, a UUID or a world wide name its
// hexadecimal digits, of any other value its words in lower case with the marks between them.
std::string CanonicalForm(std::string_view value);

}  // namespace NQRVZEP20
