// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <string>

namespace NQRVZEP20::zep {

// The SHA-256 checksum of a file, in 64 hexadecimal digits. Throws std::system_error when it cannot be read.
std::string Sha256Of(std::string const& file);

}  // namespace NQRVZEP20::zep
