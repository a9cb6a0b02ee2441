// SPDX-License-Identifier: Apache-2.0
#include "Address.h"

#include "Limits.h"
#include "NetlinkDump.h"
#include "NetlinkMessages.h"

#include <arpa/inet.h>
#include <linux/if_addr.h>
#include <linux/rtnetlink.h>

#include <algorithm>
#include <set>

namespace NQRVZEP20 {

namespace {

constexpr unsigned kProtocolAttribute = 11;  // IFA_PROTO, since Linux 5.18

TFinding<std::uint32_t> SecondsFrom(std::uint32_t seconds) {
  if (seconds == UINT32_MAX) return TMissing{kMissingNotApplicable, "the address does not expire"};
  return seconds;
}

// IFA_LOCAL is the address of the interface where the two differ: on a point-to-point link, IFA_ADDRESS is that of the peer.
TAddress AddressFrom(ifaddrmsg const& header, TNetlinkAttributes const& attributes) {
  auto const of = IpText(attributes.Bytes(IFA_ADDRESS)), local = IpText(attributes.Bytes(IFA_LOCAL));
  auto const flags = attributes.Number<std::uint32_t>(IFA_FLAGS);
  auto const lifetimes = attributes.Number<ifa_cacheinfo>(IFA_CACHEINFO);
  auto const protocol = attributes.Number<std::uint8_t>(kProtocolAttribute);
  TAddress address;
  address.fFamily = header.ifa_family;
  address.fAddress = local ? *local : of ? *of : "";
  address.fPrefixLength = header.ifa_prefixlen;
  address.fScope = header.ifa_scope;
  address.fFlags = flags ? *flags : header.ifa_flags;
  address.fProtocol = protocol ? *protocol : std::uint8_t(0);
  if (local && of && *local != *of) address.fPeer = *of;
  address.fBroadcast = IpText(attributes.Bytes(IFA_BROADCAST));
  address.fLabel = attributes.Text(IFA_LABEL);
  address.fPreferredSeconds = lifetimes.Then([](ifa_cacheinfo const& info) { return SecondsFrom(info.ifa_prefered); });
  address.fValidSeconds = lifetimes.Then([](ifa_cacheinfo const& info) { return SecondsFrom(info.ifa_valid); });
  return address;
}

bool IsValid(TAddress const& address) {
  bool const isIPv6 = address.fAddress.find(':') != std::string::npos;
  return !address.fAddress.empty() && isIPv6 == (address.fFamily == AF_INET6) && address.fPrefixLength <= (isIPv6 ? 128 : 32);
}

}  // namespace

TFinding<std::string> IpText(std::string_view bytes) {
  char text[INET6_ADDRSTRLEN];
  if (bytes.empty()) return TLink::WhyAbsent();
  if (bytes.size() != sizeof(in_addr) && bytes.size() != sizeof(in6_addr))
    return TMissing{kMissingUnexpected, "an IP address of " + std::to_string(bytes.size()) + " bytes"};
  int const family = bytes.size() == sizeof(in_addr) ? AF_INET : AF_INET6;
  return std::string(::inet_ntop(family, bytes.data(), text, sizeof text));
}

std::string MaskOf(unsigned prefixLength) {
  std::uint32_t const mask = htonl(prefixLength == 0 ? 0 : UINT32_MAX << (32 - std::min(prefixLength, 32u)));
  return *IpText({reinterpret_cast<char const*>(&mask), sizeof mask});
}

std::string TAddress::Name() const { return fInterface + " " + fAddress + "/" + std::to_string(fPrefixLength); }

TAddresses AddressesIn(std::string const& dump, TLinks const& links) {
  TAddresses addresses;
  std::set<std::string> names;
  VisitMessages<ifaddrmsg>(dump, RTM_NEWADDR, [&](ifaddrmsg const& header, TNetlinkAttributes const& attributes) {
    TLink const* const link = links.WithIndex(std::uint32_t(header.ifa_index));
    TAddress address = AddressFrom(header, attributes);
    if (link == nullptr || !IsValid(address)) return;
    address.fInterface = link->fName;
    if (names.insert(address.Name()).second && names.size() <= kInstanceLimit) addresses.fAll.push_back(std::move(address));
  });
  if (names.size() > kInstanceLimit) addresses.fWhyNotAll = WhyNotAll(std::to_string(names.size()) + " IP addresses");
  if (names.empty()) addresses.fWhyNotAll = TMissing{kMissingNotGiven, "the kernel lists no IP address"};
  return addresses;
}

TAddresses AddressesOf(TMachineFiles const& files, TLinks const& links) {
  auto const dump = files.Answer("netlink/addresses", [] { return NetlinkDump(RTM_GETADDR, AF_UNSPEC); });
  return dump ? AddressesIn(*dump, links) : TAddresses{{}, dump.Why()};
}

}  // namespace NQRVZEP20
