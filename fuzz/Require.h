// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <cstdlib>

// Aborts the fuzz target, which then reports the input, when a condition that must always hold is false.
inline void Require(bool isTrue) {
  if (!isTrue) std::abort();
}
