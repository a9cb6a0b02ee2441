// SPDX-License-Identifier: Apache-2.0
#include "Route.h"

#include "Address.h"
#include "Limits.h"
#include "NetlinkDump.h"
#include "NetlinkMessages.h"

#include <linux/rtnetlink.h>

#include <set>

namespace NQRVZEP20 {

namespace {

// Some 30,000 routes. Reading a million would take a second and tell no more.
constexpr std::size_t kDumpLimit = std::size_t(4) << 20;

bool IsOfMainTable(rtmsg const& header, TNetlinkAttributes const& attributes) {
  auto const table = attributes.Number<std::uint32_t>(RTA_TABLE);
  return (table ? *table : header.rtm_table) == RT_TABLE_MAIN && (header.rtm_flags & RTM_F_CLONED) == 0;
}

// RTA_VIA: the address of a gateway of the other family, after the number of that family.
TFinding<std::string> GatewayIn(TNetlinkAttributes const& attributes) {
  if (!attributes.Has(RTA_VIA)) return IpText(attributes.Bytes(RTA_GATEWAY));
  std::string_view const via = attributes.Bytes(RTA_VIA);
  return IpText(via.substr(std::min(sizeof(rtvia), via.size())));
}

// The attributes of the next hop, which are those of the route itself if it has only one.
TRoute WithNextHop(TRoute route, TFinding<std::uint32_t> const& index, TNetlinkAttributes const& hop, TLinks const& links) {
  route.fInterface = links.NameOf(index);
  route.fGateway = GatewayIn(hop);
  return route;
}

// A list of structures rtnexthop, each with its own attributes.
std::vector<TRoute> HopsIn(std::string_view list, TRoute const& route, TLinks const& links) {
  std::vector<TRoute> routes;
  rtnexthop hop;
  while (list.size() >= sizeof hop) {
    std::memcpy(&hop, list.data(), sizeof hop);
    if (hop.rtnh_len < sizeof hop || hop.rtnh_len > list.size()) break;
    TNetlinkAttributes const attributes(list.substr(sizeof hop, hop.rtnh_len - sizeof hop));
    routes.push_back(WithNextHop(route, static_cast<std::uint32_t>(hop.rtnh_ifindex), attributes, links));
    routes.back().fFlags = hop.rtnh_flags;
    list.remove_prefix(std::min<std::size_t>(RTNH_ALIGN(hop.rtnh_len), list.size()));
  }
  return routes;
}

std::vector<TRoute> RoutesFrom(rtmsg const& header, TNetlinkAttributes const& attributes, TLinks const& links) {
  auto const destination = IpText(attributes.Bytes(RTA_DST));
  auto const metric = attributes.Number<std::uint32_t>(RTA_PRIORITY);
  TRoute route;
  route.fFamily = header.rtm_family;
  route.fDestination = destination ? *destination : header.rtm_family == AF_INET6 ? "::" : "0.0.0.0";
  route.fPrefixLength = header.rtm_dst_len;
  route.fProtocol = header.rtm_protocol;
  route.fScope = header.rtm_scope;
  route.fType = header.rtm_type;
  route.fFlags = header.rtm_flags;
  route.fMetric = metric ? *metric : 0;
  route.fPreferredSource = IpText(attributes.Bytes(RTA_PREFSRC));
  if (attributes.Has(RTA_MULTIPATH)) return HopsIn(attributes.Bytes(RTA_MULTIPATH), route, links);
  return {WithNextHop(route, attributes.Number<std::uint32_t>(RTA_OIF), attributes, links)};
}

bool IsValid(TRoute const& route) {
  bool const isIPv6 = route.fDestination.find(':') != std::string::npos;
  if (route.fFamily != AF_INET && route.fFamily != AF_INET6) return false;
  return isIPv6 == (route.fFamily == AF_INET6) && route.fPrefixLength <= (isIPv6 ? 128 : 32);
}

// The kernel ends each dump with NLMSG_DONE, which is missing where reading stopped at the limit.
bool IsCutOff(std::string const& dump) {
  unsigned last = NLMSG_DONE;
  VisitPayloads(dump, [&](unsigned type, std::string_view) { last = type; });
  return last != NLMSG_DONE;
}

}  // namespace

std::string TRoute::Name() const {
  std::string name = fDestination + "/" + std::to_string(fPrefixLength);
  if (fGateway) name += " via " + *fGateway;
  if (fInterface) name += " dev " + *fInterface;
  if (fMetric != 0) name += " metric " + std::to_string(fMetric);
  return name;
}

TRoutes RoutesIn(std::string const& dump, TLinks const& links) {
  TRoutes routes;
  std::set<std::string> names;
  std::size_t count = 0;
  VisitMessages<rtmsg>(dump, RTM_NEWROUTE, [&](rtmsg const& header, TNetlinkAttributes const& attributes) {
    if (!IsOfMainTable(header, attributes) || ++count > kInstanceLimit) return;
    for (TRoute& route : RoutesFrom(header, attributes, links))
      if (IsValid(route) && names.insert(route.Name()).second) routes.fAll.push_back(std::move(route));
  });
  bool const isCutOff = IsCutOff(dump);
  if (count > kInstanceLimit || isCutOff)
    routes.fWhyNotAll = WhyNotAll((isCutOff ? "more than " : "") + std::to_string(count) + " routes");
  if (routes.fAll.empty()) routes.fWhyNotAll = TMissing{kMissingNotGiven, "the kernel lists no route"};
  return routes;
}

TRoutes RoutesOf(TMachineFiles const& files, TLinks const& links) {
  auto const dump = files.Answer("netlink/routes", []() -> TFinding<std::string> {
    auto const ipv4 = NetlinkDump(RTM_GETROUTE, AF_INET, kDumpLimit);
    auto const ipv6 = NetlinkDump(RTM_GETROUTE, AF_INET6, kDumpLimit);
    if (!ipv4 && !ipv6) return ipv4;
    return (ipv4 ? *ipv4 : "") + (ipv6 ? *ipv6 : "");
  });
  return dump ? RoutesIn(*dump, links) : TRoutes{{}, dump.Why()};
}

}  // namespace NQRVZEP20
