// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <functional>
#include <optional>
#include <string>
#include <vector>

namespace NQRVZEP20::zep {

struct TReply {
  std::size_t fSize;  // bytes
  std::string fSender;
  long fMilliseconds;  // since the last message was sent
};

// The query for one interface, or for an IPv6 address, and its result.
struct TQuery {
  std::string fInterface;  // empty: the query for an IPv6 address
  bool fIsUp = true, fIsPromiscuous = false;
  std::string fAddress, fHardwareAddress;
  int fSent = 0;  // messages
  std::optional<TReply> fReply;
  std::string fUrl;      // in the reply; empty when it contains none
  std::string fFailure;  // why no message was sent or no reply could arrive; empty when the query was just not answered
};

struct TSearch {
  std::vector<TQuery> fQueries;
  std::string fUrl;      // empty: no server returned one
  std::string fFailure;  // why the search ended early
};

// Called once a second while the search waits for a reply, with the seconds that are left for the query.
using TOnWait = std::function<void(TQuery const& query, int secondsLeft)>;

// Why this process can never listen on the port of DHCP clients; empty when it can, now or later.
std::string WhyNoListening();

// Whether another program is using the port at this moment.
bool IsPortTaken();

// Performs the discovery of AutoProxyDiscovery::StartWpad without ending DHCP clients, and does not wait where no reply can
// arrive: after a message that could not be sent, and when the port stays in use, which ends the search.
TSearch SearchProxy(TOnWait const& onWait);

}  // namespace NQRVZEP20::zep
