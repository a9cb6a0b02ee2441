// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <string>
#include <string_view>
#include <vector>

namespace NQRVZEP20 {

// The numbers in a list of the kernel, such as "0-3,8": {0, 1, 2, 3, 8}. Empty when the text is not such a list, or has a number
// above 65535.
std::vector<unsigned> CpusIn(std::string_view list);

// The list of these numbers, which must be in ascending order: "0-3,8".
std::string CpuListOf(std::vector<unsigned> const& cpus);

}  // namespace NQRVZEP20
