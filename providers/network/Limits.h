// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "providers/reasons/Missing.h"

#include <cstddef>
#include <string>

namespace NQRVZEP20 {

// At most this many interfaces, addresses and routes become instances. A router may have a million routes.
constexpr std::size_t kInstanceLimit = 1000;

// The code of the reason why not all of them do.
constexpr char const* kMissingTooMany = "too-many";

inline TMissing WhyNotAll(std::string const& found) {
  return {kMissingTooMany, "the kernel lists " + found + "; the first " + std::to_string(kInstanceLimit) + " are described"};
}

}  // namespace NQRVZEP20
