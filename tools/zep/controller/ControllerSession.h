// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <string>

namespace NQRVZEP20::zep {

struct TAccount;

// Opens a session with the controller of the host, which is the process's then. Returns why there is none, or an empty text.
// For a process with no other thread: it changes the threshold of the log for as long as it runs.
std::string WhyNoSession(std::string const& host, TAccount const& account);

}  // namespace NQRVZEP20::zep
