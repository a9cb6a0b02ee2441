// SPDX-License-Identifier: Apache-2.0
#include "collect/process/SignalText.h"

#include <string.h>

namespace NQRVZEP20 {

std::string SignalText(int signal) {
  char const* const name = ::sigabbrev_np(signal);
  char const* const text = ::sigdescr_np(signal);
  if (name == nullptr || text == nullptr) return "signal " + std::to_string(signal);
  return "SIG" + std::string(name) + " (" + text + ")";
}

}  // namespace NQRVZEP20
