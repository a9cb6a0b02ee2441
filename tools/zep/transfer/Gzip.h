// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <string>

namespace NQRVZEP20::zep {

// Compresses the bytes into the gzip format (RFC 1952), without a file name and a time. Throws std::bad_alloc if memory runs
// out.
std::string Gzipped(std::string const& bytes);

}  // namespace NQRVZEP20::zep
