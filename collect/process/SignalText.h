// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <string>

namespace NQRVZEP20 {

// "SIGSEGV"; "signal 40" for a signal without a name.
std::string SignalName(int signal);

// "SIGSEGV (Segmentation fault)"; "signal 40" for a signal without a name.
std::string SignalText(int signal);

}  // namespace NQRVZEP20
