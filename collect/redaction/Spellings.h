// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <string>
#include <string_view>
#include <vector>

namespace NQRVZEP20 {

// The ways in which a value may be written in a text, in lower case and without repetitions, the value itself first: with other
// or no separators, as hexadecimal digits of its characters, as UTF-16, in base64, percent-encoded and with escapes; an IP
// address also as hexadecimal digits, a UUID also with its bytes in the other order.
std::vector<std::string> SpellingsOf(std::string_view value);

}  // namespace NQRVZEP20
