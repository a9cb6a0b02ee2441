// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <string>

namespace NQRVZEP20::zep {

// The SHA-256 checksum of a file as 64 hexadecimal digits. An interrupt (Interrupts.h) ends the computation; the result is then
// empty. Throws std::system_error if the file cannot be read, and like TSha256 (packing/Checksum.h).
std::string Sha256Of(std::string const& file);

// The same of a text.
std::string Sha256OfText(std::string const& text);

}  // namespace NQRVZEP20::zep
