// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <string_view>

namespace NQRVZEP20::zep {

// Writes the complete text, and continues after a signal. Returns false, with the reason in errno, when it cannot.
bool WriteWhole(int fd, std::string_view text);

}  // namespace NQRVZEP20::zep
