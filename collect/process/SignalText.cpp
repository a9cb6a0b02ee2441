// SPDX-License-Identifier: Apache-2.0
#include "collect/process/SignalText.h"

#include <string.h>

namespace NQRVZEP20 {

std::string SignalName(int signal) {
  char const* const name = ::sigabbrev_np(signal);
  return name != nullptr ? "SIG" + std::string(name) : "signal " + std::to_string(signal);
}

std::string SignalText(int signal) {
  char const* const text = ::sigdescr_np(signal);
  return SignalName(signal) + (text != nullptr ? " (" + std::string(text) + ")" : "");
}

}  // namespace NQRVZEP20
