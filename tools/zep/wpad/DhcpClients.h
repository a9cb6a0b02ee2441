// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <string>
#include <vector>

namespace NQRVZEP20::zep {

// The lines of "ps -e" that contain "dhclient". AutoProxyDiscovery::wpadPreconfig kills the processes with the IDs at the start
// of these lines.
std::vector<std::string> DhcpClientLines();

// Why the process of one of the lines must not be killed; empty if all of them may be. Some versions of "ps" print a name with
// a line break as two lines, the second of which can start with any process ID. Therefore the process itself must have the
// name.
std::string WhyNotToBeEnded(std::vector<std::string> const& lines);

}  // namespace NQRVZEP20::zep
