// SPDX-License-Identifier: Apache-2.0

// RouteRecord: a route as an instance.

#include "Address.h"
#include "Route.h"

#include <linux/rtnetlink.h>

#include <iterator>

namespace NQRVZEP20 {

namespace {

using TText = TFinding<std::string>;

constexpr TValueName kDerivations[] = {{"1", "Other"}, {"2", "Connected"}, {"3", "User-Defined"}, {"5", "EIGRP"},
                                       {"6", "RIP"},   {"9", "BGP"},       {"10", "ISIS"},        {"11", "OSPF"}};
constexpr TValueName kTypesOfRoute[] = {{"2", "Administrator Defined Route"}, {"3", "Computed Route"}, {"4", "Actual Route"}};
constexpr std::uint16_t kOther = 1, kConnected = 2, kUserDefined = 3;
constexpr std::uint16_t kByAdministrator = 2, kComputed = 3, kActual = 4;
constexpr TValueName kAddressTypes[] = {{"1", "IPv4"}, {"2", "IPv6"}};

struct TProtocol {
  std::uint8_t fNumber;
  char const* fWord;
  std::uint16_t fDerivation, fTypeOfRoute;
};

constexpr TProtocol kProtocols[] = {
    {1, "redirect", kOther, kActual},
    {2, "kernel", kConnected, kActual},
    {3, "boot", kUserDefined, kByAdministrator},
    {4, "static", kUserDefined, kByAdministrator},
    {8, "gated", kOther, kComputed},
    {9, "ra", kOther, kActual},
    {11, "zebra", kOther, kComputed},
    {12, "bird", kOther, kComputed},
    {14, "xorp", kOther, kComputed},
    {16, "dhcp", kOther, kActual},
    {17, "mrouted", kOther, kComputed},
    {18, "keepalived", kOther, kComputed},
    {42, "babel", kOther, kComputed},
    {186, "bgp", 9, kComputed},
    {187, "isis", 10, kComputed},
    {188, "ospf", 11, kComputed},
    {189, "rip", 6, kComputed},
    {192, "eigrp", 5, kComputed},
};

TFinding<TProtocol> ProtocolOf(TRoute const& route) {
  for (TProtocol const& known : kProtocols)
    if (known.fNumber == route.fProtocol) return known;
  return TMissing{kMissingNotGiven, "the kernel reports the origin as number " + std::to_string(route.fProtocol)};
}

TText RouteTypeOf(TRoute const& route) {
  constexpr char const* kTypes[] = {"unspec",    "unicast",     "local",    "broadcast", "anycast", "multicast",
                                    "blackhole", "unreachable", "prohibit", "throw",     "nat",     "xresolve"};
  if (route.fType < std::size(kTypes)) return std::string(kTypes[route.fType]);
  return TMissing{kMissingUnexpected, std::to_string(route.fType) + " is not a type of routes"};
}

std::string ScopeOf(TRoute const& route) {
  switch (route.fScope) {
    case RT_SCOPE_UNIVERSE:
      return "global";
    case RT_SCOPE_SITE:
      return "site";
    case RT_SCOPE_LINK:
      return "link";
    case RT_SCOPE_HOST:
      return "host";
    case RT_SCOPE_NOWHERE:
      return "nowhere";
    default:
      return std::to_string(route.fScope);
  }
}

std::vector<std::string> FlagWordsOf(TRoute const& route) {
  constexpr struct {
    std::uint32_t fBit;
    char const* fWord;
  } kFlags[] = {{RTNH_F_DEAD, "dead"},       {RTNH_F_PERVASIVE, "pervasive"}, {RTNH_F_ONLINK, "onlink"},
                {RTNH_F_OFFLOAD, "offload"}, {RTNH_F_LINKDOWN, "linkdown"},   {RTNH_F_UNRESOLVED, "unresolved"}};
  std::vector<std::string> words;
  for (auto const& flag : kFlags)
    if ((route.fFlags & flag.fBit) != 0) words.emplace_back(flag.fWord);
  return words;
}

TText Or(TText const& value, char const* reason) { return value ? value : TMissing{kMissingNotApplicable, reason}; }

template <class T>
TFinding<T> If(bool isOfFamily, T value) {
  if (isOfFamily) return value;
  return TMissing{kMissingNotApplicable, "the route is of the other family"};
}

TFinding<std::uint16_t> MetricOf(TRoute const& route) {
  if (route.fMetric <= UINT16_MAX) return static_cast<std::uint16_t>(route.fMetric);
  return TMissing{kMissingUnexpected, std::to_string(route.fMetric) + " exceeds the 16 bits of the property; see Metric"};
}

void AddOrigin(TRecord& record, TFinding<TProtocol> const& protocol) {
  record.Add("RouteDerivation", protocol.Then([](TProtocol const& of) { return of.fDerivation; })).Names(kDerivations);
  record.Add("OtherDerivation", protocol.Then([](TProtocol const& of) -> TText {
    if (of.fDerivation == kOther) return std::string(of.fWord);
    return TMissing{kMissingNotApplicable, "RouteDerivation describes the origin"};
  }));
  record.Add("IsStatic", protocol.Then([](TProtocol const& of) { return of.fTypeOfRoute == kByAdministrator; }));
  record.Add("TypeOfRoute", protocol.Then([](TProtocol const& of) { return of.fTypeOfRoute; })).Names(kTypesOfRoute);
  record.Add("Protocol", protocol.Then([](TProtocol const& of) { return std::string(of.fWord); }));
}

}  // namespace

TRecord RouteRecord(TRoute const& route) {
  bool const isIPv6 = route.fFamily == AF_INET6;
  TRecord record("ZEP_NextHopIPRoute", "rtnetlink", "CIM_NextHopIPRoute");
  record.AddKey("InstanceID", "route " + route.Name());
  record.Add("DestinationAddress", TText(route.fDestination));
  record.Add("DestinationMask", If(!isIPv6, MaskOf(route.fPrefixLength)));
  record.Add("PrefixLength", If(isIPv6, route.fPrefixLength));
  record.Add("AddressType", TFinding<std::uint16_t>(std::uint16_t(isIPv6 ? 2 : 1))).Names(kAddressTypes);
  record.Add("RouteMetric", MetricOf(route));
  AddOrigin(record, ProtocolOf(route));
  record.Add("Metric", TFinding<std::uint32_t>(route.fMetric));
  record.Add("Gateway", Or(route.fGateway, "the destination is reached without a gateway"));
  record.Add("InterfaceName", route.fInterface);
  record.Add("PreferredSource", Or(route.fPreferredSource, "the route names no source address"));
  record.Add("Scope", TText(ScopeOf(route)));
  record.Add("RouteType", RouteTypeOf(route));
  record.Add("RouteFlags", TFinding<std::vector<std::string>>(FlagWordsOf(route)));
  return record;
}

}  // namespace NQRVZEP20
