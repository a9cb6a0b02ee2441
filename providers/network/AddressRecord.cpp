// SPDX-License-Identifier: Apache-2.0

// AddressRecord: an IP address as an instance.

#include "Address.h"

#include <arpa/inet.h>
#include <linux/if_addr.h>
#include <linux/rtnetlink.h>

namespace NQRVZEP20 {

namespace {

using TText = TFinding<std::string>;

constexpr TValueName kInterfaceTypes[] = {{"4096", "IPv4"}, {"4097", "IPv6"}};
constexpr std::uint16_t kIPv4 = 4096, kIPv6 = 4097;
constexpr TValueName kOrigins[] = {
    {"3", "Static"}, {"4", "DHCP"}, {"6", "IPv4 Link Local"}, {"9", "Stateless"}, {"10", "Link Local"}};
constexpr std::uint16_t kStatic = 3, kDhcp = 4, kIPv4LinkLocal = 6, kStateless = 9, kLinkLocal = 10;
constexpr TValueName kIPv6Types[] = {{"2", "Unspecified"},        {"3", "Loopback"},       {"4", "Multicast"},
                                     {"5", "Link Local Unicast"}, {"6", "Global Unicast"}, {"7", "Embedded IPv4 Address"},
                                     {"8", "Site Local Unicast"}};
constexpr std::uint8_t kSetByRouterAdvertisement = 2;  // IFAPROT_KERNEL_RA, since Linux 5.18

struct TFlag {
  std::uint32_t fBit;
  char const* fWord;
};

constexpr TFlag kFlags[] = {{IFA_F_NODAD, "nodad"},
                            {IFA_F_OPTIMISTIC, "optimistic"},
                            {IFA_F_DADFAILED, "dadfailed"},
                            {IFA_F_HOMEADDRESS, "home"},
                            {IFA_F_DEPRECATED, "deprecated"},
                            {IFA_F_TENTATIVE, "tentative"},
                            {IFA_F_MANAGETEMPADDR, "mngtmpaddr"},
                            {IFA_F_NOPREFIXROUTE, "noprefixroute"},
                            {IFA_F_MCAUTOJOIN, "autojoin"},
                            {IFA_F_STABLE_PRIVACY, "stable-privacy"}};

bool IsIPv6(TAddress const& address) { return address.fFamily == AF_INET6; }

in6_addr BytesOf(TAddress const& address) {
  in6_addr bytes = {};
  ::inet_pton(AF_INET6, address.fAddress.c_str(), &bytes);
  return bytes;
}

bool IsLinkLocal(TAddress const& address) {
  if (!IsIPv6(address)) return address.fAddress.rfind("169.254.", 0) == 0;
  in6_addr const bytes = BytesOf(address);
  return IN6_IS_ADDR_LINKLOCAL(&bytes);
}

// The kernel does not record who set an address. An address that never expires is taken for a static one, and an IPv4 address
// that expires for one of DHCP.
TFinding<std::uint16_t> OriginOf(TAddress const& address) {
  if (IsLinkLocal(address)) return IsIPv6(address) ? kLinkLocal : kIPv4LinkLocal;
  std::uint32_t const stateless = IFA_F_MANAGETEMPADDR | IFA_F_STABLE_PRIVACY | IFA_F_TEMPORARY;
  bool const isStateless = IsIPv6(address) && (address.fFlags & stateless) != 0;
  if (isStateless || address.fProtocol == kSetByRouterAdvertisement) return kStateless;
  if ((address.fFlags & IFA_F_PERMANENT) != 0) return kStatic;
  if (!IsIPv6(address)) return kDhcp;
  return TMissing{kMissingNotGiven, "the kernel does not report whether the address comes from DHCPv6 or from a router"};
}

std::uint16_t IPv6TypeOf(TAddress const& address) {
  in6_addr const bytes = BytesOf(address);
  if (IN6_IS_ADDR_UNSPECIFIED(&bytes)) return 2;
  if (IN6_IS_ADDR_LOOPBACK(&bytes)) return 3;
  if (IN6_IS_ADDR_MULTICAST(&bytes)) return 4;
  if (IN6_IS_ADDR_LINKLOCAL(&bytes)) return 5;
  if (IN6_IS_ADDR_V4MAPPED(&bytes)) return 7;
  return IN6_IS_ADDR_SITELOCAL(&bytes) ? 8 : 6;
}

TText ScopeOf(TAddress const& address) {
  switch (address.fScope) {
    case RT_SCOPE_UNIVERSE:
      return std::string("global");
    case RT_SCOPE_SITE:
      return std::string("site");
    case RT_SCOPE_LINK:
      return std::string("link");
    case RT_SCOPE_HOST:
      return std::string("host");
    case RT_SCOPE_NOWHERE:
      return std::string("nowhere");
    default:
      return std::to_string(address.fScope);
  }
}

TFinding<std::vector<std::string>> FlagWordsOf(TAddress const& address) {
  std::vector<std::string> words;
  if ((address.fFlags & IFA_F_PERMANENT) == 0) words.emplace_back("dynamic");
  if ((address.fFlags & IFA_F_SECONDARY) != 0) words.emplace_back(IsIPv6(address) ? "temporary" : "secondary");
  for (TFlag const& flag : kFlags)
    if ((address.fFlags & flag.fBit) != 0) words.emplace_back(flag.fWord);
  return words;
}

// The value if the address is one of that family.
template <class T>
TFinding<T> If(bool isOfFamily, T value) {
  if (isOfFamily) return value;
  return TMissing{kMissingNotApplicable, "the address is of the other family"};
}

}  // namespace

TRecord AddressRecord(TAddress const& address, TComputerSystem const& system) {
  bool const isIPv6 = IsIPv6(address);
  TRecord record("ZEP_IPProtocolEndpoint", "rtnetlink", "CIM_IPProtocolEndpoint");
  system.AddHostedKeys(record, address.Name());
  record.Add("ElementName", TText(address.fAddress));
  record.Add("ProtocolIFType", TFinding<std::uint16_t>(isIPv6 ? kIPv6 : kIPv4)).Names(kInterfaceTypes);
  record.Add("IPv4Address", If(!isIPv6, address.fAddress));
  record.Add("SubnetMask", If(!isIPv6, MaskOf(address.fPrefixLength)));
  record.Add("IPv6Address", If(isIPv6, address.fAddress));
  record.Add("PrefixLength", If(isIPv6, address.fPrefixLength));
  record.Add("IPv6SubnetPrefixLength", If(isIPv6, std::uint16_t(address.fPrefixLength)));
  record.Add("IPv6AddressType", If(isIPv6, IPv6TypeOf(address))).Names(kIPv6Types);
  record.Add("AddressOrigin", OriginOf(address)).Names(kOrigins);
  record.Add("InterfaceName", TText(address.fInterface));
  record.Add("Scope", ScopeOf(address));
  record.Add("AddressFlags", FlagWordsOf(address));
  record.Add("BroadcastAddress", isIPv6 ? If(false, std::string()) : address.fBroadcast);
  record.Add("PeerAddress",
             address.fPeer ? address.fPeer : TMissing{kMissingNotApplicable, "the link is not a point-to-point link"});
  record.Add("Label", isIPv6 ? If(false, std::string()) : address.fLabel);
  record.Add("PreferredLifetime", address.fPreferredSeconds).Unit("second");
  record.Add("ValidLifetime", address.fValidSeconds).Unit("second");
  return record;
}

}  // namespace NQRVZEP20
