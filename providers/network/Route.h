// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "Link.h"
#include "providers/reasons/TComputerSystem.h"
#include "providers/reasons/TRecord.h"

#include <sys/socket.h>

#include <optional>

namespace NQRVZEP20 {

// A route of the main table; of a route with several next hops, one of them.
struct TRoute {
  sa_family_t fFamily = AF_INET;  // or AF_INET6
  std::string fDestination;       // an address as text
  std::uint8_t fPrefixLength = 0;
  std::uint8_t fProtocol = 0;  // RTPROT_KERNEL, …
  std::uint8_t fScope = 0;     // RT_SCOPE_UNIVERSE, …
  std::uint8_t fType = 0;      // RTN_UNICAST, …
  std::uint32_t fFlags = 0;    // RTNH_F_LINKDOWN, …
  std::uint32_t fMetric = 0;
  TFinding<std::string> fGateway = TLink::WhyAbsent();
  TFinding<std::string> fInterface = TLink::WhyAbsent();  // its name
  TFinding<std::string> fPreferredSource = TLink::WhyAbsent();

  bool IsDefault() const { return fPrefixLength == 0; }

  // "0.0.0.0/0 via 10.0.2.2 dev eth0 metric 100": unique in the table.
  std::string Name() const;
};

struct TRoutes {
  std::vector<TRoute> fAll;
  std::optional<TMissing> fWhyNotAll;  // why there are no routes, or not all
};

// The routes of the main table in answers to RTM_GETROUTE: at most 1,000, of which no two have the same name.
TRoutes RoutesIn(std::string const& dump, TLinks const& links);

// From the answer "netlink/routes": the routes of IPv4, and then those of IPv6.
TRoutes RoutesOf(TMachineFiles const& files, TLinks const& links);

// ZEP_NextHopIPRoute.
TRecord RouteRecord(TRoute const& route);

}  // namespace NQRVZEP20
