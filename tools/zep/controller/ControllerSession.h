// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <string>

namespace NQRVZEP20::zep {

struct TAccount;

// Opens a session with the controller of the host. The session belongs to the process. Returns the reason for a failure, or an
// empty string. Blocks until the session is open or the library gives up.
std::string WhyNoSession(std::string const& host, TAccount const& account);

}  // namespace NQRVZEP20::zep
