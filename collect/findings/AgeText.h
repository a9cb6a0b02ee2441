// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <cstdint>
#include <string>

namespace NQRVZEP20 {

constexpr std::uint64_t kSecondsOfADay = 86400;

// "less than a minute ago", "5 hours ago"; days from two days on.
std::string AgeText(std::uint64_t seconds);

}  // namespace NQRVZEP20
