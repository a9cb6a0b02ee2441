// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <string>

namespace NQRVZEP20::zep {

// The bytes as a gzip file has them (RFC 1952), without a name and a time. Throws std::bad_alloc when memory is short.
std::string Gzipped(std::string const& bytes);

}  // namespace NQRVZEP20::zep
