// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <string>
#include <string_view>
#include <vector>

namespace NQRVZEP20 {

// The ways in which a value may be written in a text, besides its marks (TNormalText.h), the value itself first: without marks,
// as hexadecimal digits of its characters, as UTF-16 and percent-encoded; hexadecimal digits also in groups; an IP address also
// as hexadecimal digits, a UUID also with its bytes in the other order.
std::vector<std::string> SpellingsOf(std::string_view value);

// The value in base64, alone and after one and two other bytes, without the characters that depend on its neighbours. None of a
// value shorter than six characters, whose forms are common words.
std::vector<std::string> Base64Of(std::string_view value);

// A text that is the same for all spellings of the same value: of a MAC or IPv6 address, a UUID or a world wide name its
// hexadecimal digits, of any other value its words in lower case with the marks between them.
std::string CanonicalForm(std::string_view value);

}  // namespace NQRVZEP20
