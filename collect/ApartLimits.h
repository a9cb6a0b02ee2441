// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <cstdint>

namespace NQRVZEP20 {

// The limits for the process of a plug-in. A process that exceeds one is ended, with every process that it started.
struct TApartLimits {
  int fTimeoutSeconds = 60;                           // for the load of the library, and again for the fill of all its namespaces
  std::uint64_t fMemoryMebibytes = 0;                 // that the process may use in addition to those of this process; 0: any
  std::uint64_t fAnswerBytes = 256ull * 1024 * 1024;  // of one namespace
};

}  // namespace NQRVZEP20
