// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <string>
#include <string_view>

namespace NQRVZEP20::zep {

// Whether the character needs no escape in a URL: a letter, a digit, "-", ".", "_" or "~".
bool IsUnreserved(char c);

// Percent-encodes every character ("%2F") except the unreserved ones and those in `others`.
std::string Encoded(std::string_view text, std::string_view others);

// Percent-encodes a path. Existing escapes ("%2F") are kept.
std::string EncodedPath(std::string_view text);

// Replaces each escape by the character that it stands for.
std::string Decoded(std::string_view text);

}  // namespace NQRVZEP20::zep
