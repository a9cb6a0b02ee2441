// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <string>

namespace NQRVZEP20 {

// "SIGSEGV (Segmentation fault)"; "signal 40" for a signal without a name.
std::string SignalText(int signal);

}  // namespace NQRVZEP20
