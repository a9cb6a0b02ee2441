// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <cstdint>

namespace NQRVZEP20 {

// The limits for a plug-in process. If it exceeds one, it is killed with all processes that it started.
struct TApartLimits {
  int fTimeoutSeconds = 60;                           // for loading the library, and again for filling all its namespaces
  std::uint64_t fMemoryMebibytes = 0;                 // memory in addition to what this process uses; 0: no limit
  std::uint64_t fAnswerBytes = 256ull * 1024 * 1024;  // the size of all its namespaces together, serialised
};

}  // namespace NQRVZEP20
