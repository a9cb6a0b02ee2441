// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "providers/reasons/TFinding.h"

#include <cstddef>
#include <string>

namespace NQRVZEP20 {

// Asks the kernel for all objects of a kind (RTM_GETLINK, RTM_GETADDR, RTM_GETROUTE) and returns its messages as they are. For
// routes, only those of the main table.
//
// `family`: AF_UNSPEC for all. Reading stops after `limit` bytes, at the end of a message; the last message is then not
// NLMSG_DONE. A dump during which objects changed is repeated up to three times. Missing if the kernel refuses the socket or the
// request, or does not answer within a second.
TFinding<std::string> NetlinkDump(int request, unsigned char family, std::size_t limit = std::size_t(8) << 20);

}  // namespace NQRVZEP20
