// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <string>

namespace NQRVZEP20::zep {

// Tries to connect to a TCP port, and returns why that fails, with a remedy: the host name has no address, or each of its
// addresses refuses the connection or does not answer within `timeoutSeconds`. Returns an empty text if it succeeds. Blocks; an
// interrupt (Interrupts.h) ends the wait, and the result is then "interrupted".
std::string WhyUnreachable(std::string const& host, std::string const& port, int timeoutSeconds);

}  // namespace NQRVZEP20::zep
