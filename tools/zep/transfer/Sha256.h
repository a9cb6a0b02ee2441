// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <string>

namespace NQRVZEP20::zep {

// The SHA-256 checksum of a file, in 64 hexadecimal digits; empty after an interrupt (Interrupts.h), which ends the work. Throws
// std::system_error when the file cannot be read, and std::runtime_error when libgcrypt does not provide SHA-256.
std::string Sha256Of(std::string const& file);

}  // namespace NQRVZEP20::zep
