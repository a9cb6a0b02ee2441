// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <string>

namespace NQRVZEP20 {

constexpr int kDhcpClientPort = 68;  // where the replies arrive

// A query consists of up to three attempts; each waits for a reply.
constexpr int kWpadAttempts = 3;
constexpr int kWpadReplySeconds = 6;

// The first address that "ifconfig" prints after "inet6 addr: ", without its prefix length; empty when there is none.
std::string ShownIPV6Address();

}  // namespace NQRVZEP20
