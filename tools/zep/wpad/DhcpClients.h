// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <string>
#include <vector>

namespace NQRVZEP20::zep {

// The lines of "ps -e" that contain "dhclient". AutoProxyDiscovery::wpadPreconfig ends the processes with the numbers at the
// start of these lines.
std::vector<std::string> DhcpClientLines();

// Why the process of one of the lines must not be ended; empty when each may be. Some versions of "ps" print a name with a line
// break as two lines, the second of which can start with the number of any process. So the process itself must have the name.
std::string WhyNotToBeEnded(std::vector<std::string> const& lines);

}  // namespace NQRVZEP20::zep
