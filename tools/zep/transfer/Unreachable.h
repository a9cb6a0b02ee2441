// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <string>

namespace NQRVZEP20::zep {

// Why no connection to that TCP port can be made: the host name has no address, or each of its addresses refuses or does not
// answer within `timeoutSeconds`. Tries it, and so blocks; empty when it succeeds. A remedy is named.
// An interrupt (Interrupts.h) ends the wait, and is then the reason: "interrupted".
std::string WhyUnreachable(std::string const& host, std::string const& port, int timeoutSeconds);

}  // namespace NQRVZEP20::zep
