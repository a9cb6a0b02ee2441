// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "providers/reasons/TFinding.h"

#include <cstdint>
#include <string>
#include <string_view>

namespace NQRVZEP20 {

// How the bytes of a text are encoded: the two upper bits of the byte that also has its length.
enum class ETextForm : std::uint8_t { kBinary, kBcdPlus, kSixBit, kEightBit };
ETextForm TextFormOf(std::uint8_t typeAndLength);
std::size_t TextLengthOf(std::uint8_t typeAndLength);  // in bytes, 0 to 63

// The text as UTF-8, without blanks at either end; bytes of the form kBinary as hexadecimal digits. Characters that cannot be
// printed become "?". Eight-bit texts are Latin-1. Missing if nothing remains.
TFinding<std::string> IpmiText(ETextForm form, std::string_view bytes);

// Two hexadecimal digits for each byte: "0a:ff" with the separator ":".
std::string HexText(std::string_view bytes, char const* separator = "");

}  // namespace NQRVZEP20
