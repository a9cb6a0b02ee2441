#pragma once

#include <cstdlib>

// Ends the fuzz target, which reports the input, when what always holds does not.
inline void Require(bool isTrue) {
  if (!isTrue) std::abort();
}
