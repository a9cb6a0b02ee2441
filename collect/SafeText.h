// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <cstddef>
#include <cstdint>
#include <string>
#include <string_view>

namespace NQRVZEP20 {

// Text from firmware or a plug-in may contain anything: control characters, characters that change the writing direction, and
// bytes that are not valid UTF-8. These functions never read out of bounds and throw only std::bad_alloc.

struct TCharacter {
  std::uint32_t fCode;  // the code point, or the byte
  std::size_t fSize;    // in bytes; 0 for a byte that does not begin a UTF-8 character
};

// The character with which `text`, which is not empty, begins.
TCharacter FirstCharacterOf(std::string_view text);

// The text in a form that is safe to print on a terminal: characters that control the terminal or hide text, and bytes that are
// not valid UTF-8, become escapes such as "\x1b" or "\u202e".
std::string Printable(std::string_view text);

// The text as valid UTF-8 without zero bytes: each zero byte and each byte that is not valid UTF-8 becomes an escape such as
// "\x00" or "\xff". Other characters remain, including control characters.
std::string WithBytesEscaped(std::string_view text);

// The text; a longer one than `most` bytes, at least 3, ends in "..." and has at most that many bytes. A UTF-8 character is never
// cut apart.
std::string Shortened(std::string_view text, std::size_t most);

}  // namespace NQRVZEP20
