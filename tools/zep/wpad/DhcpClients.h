// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <string>
#include <vector>

namespace NQRVZEP20::zep {

// The lines of "ps -e" that hold "dhclient". The processes whose numbers they begin with are those that
// AutoProxyDiscovery::wpadPreconfig ends.
std::vector<std::string> DhcpClientLines();

// Why one of the lines must not be followed, or an empty text. A name with a line break in it makes a line of its own in the
// output of some "ps", and with it the number of any process. So the process must bear the name itself.
std::string WhyNotToBeEnded(std::vector<std::string> const& lines);

}  // namespace NQRVZEP20::zep
