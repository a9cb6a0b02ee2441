// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <string_view>

namespace NQRVZEP20::zep {

// Writes the complete text, and resumes after a short write or a signal. Returns false on failure, with the reason in errno.
bool WriteWhole(int fd, std::string_view text);

}  // namespace NQRVZEP20::zep
