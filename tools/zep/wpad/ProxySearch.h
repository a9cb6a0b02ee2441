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
  std::string fUrl;      // from the reply; empty if it contains none
  std::string fFailure;  // why no message was sent or no reply could arrive; empty for an unanswered query
};

struct TSearch {
  std::vector<TQuery> fQueries;
  std::string fUrl;      // empty: no server returned one
  std::string fFailure;  // why the search ended early
};

// Called once a second while the search waits for a reply, with the number of seconds left for the query.
using TOnWait = std::function<void(TQuery const& query, int secondsLeft)>;

// Why this process can never listen on the port of DHCP clients; empty if it can, now or later.
std::string WhyNoListening();

// Whether another program is using the port at this moment.
bool IsPortTaken();

// Performs the discovery of AutoProxyDiscovery::StartWpad, with two differences: it kills no DHCP clients, and it does not wait
// if no reply can arrive, either because a message could not be sent or because the port stays in use (which ends the search).
// Blocks until the search has ended.
TSearch SearchProxy(TOnWait const& onWait);

}  // namespace NQRVZEP20::zep
