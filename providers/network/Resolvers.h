// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "Route.h"
#include "providers/reasons/TComputerSystem.h"
#include "providers/reasons/TMachineFiles.h"
#include "providers/reasons/TRecord.h"

#include <string>
#include <vector>

namespace NQRVZEP20 {

// The configuration of name resolution: resolv.conf(5).
struct TResolvers {
  std::string fFile = {};
  std::vector<std::string> fServers = {}, fSearchDomains = {}, fOptions = {};
};

// The content of such a file. The last line "search" or "domain" counts, as in the C library.
TResolvers ResolversIn(std::string const& content);

// Those of /etc/resolv.conf; if its only server is the one of systemd-resolved on this machine, those that it asks.
TFinding<TResolvers> ResolversOf(TMachineFiles const& files);

// A host that serves this one, by its IP address: a resolver or a gateway.
struct TRemoteHost {
  enum EKind { kGateway, kDefaultGateway, kResolver };

  std::string fAddress;
  EKind fKind;
};

// The gateways of the routes, each once.
std::vector<TRemoteHost> GatewaysOf(TRoutes const& routes);

// CIM_RemoteServiceAccessPoint.
TRecord RemoteHostRecord(TRemoteHost const& host, std::string const& source, TComputerSystem const& system);

// ZEP_DNSSettingData: the order of resolvers, search domains and options.
TRecord DnsRecord(TResolvers const& resolvers);

}  // namespace NQRVZEP20
