// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "Link.h"
#include "providers/reasons/TComputerSystem.h"
#include "providers/reasons/TRecord.h"

#include <sys/socket.h>

#include <optional>

namespace NQRVZEP20 {

// An IP address of an interface.
struct TAddress {
  sa_family_t fFamily = AF_INET;  // or AF_INET6
  std::string fAddress;           // as text
  std::string fInterface;         // its name
  std::uint8_t fPrefixLength = 0;
  std::uint8_t fScope = 0;     // RT_SCOPE_UNIVERSE, …
  std::uint32_t fFlags = 0;    // IFA_F_PERMANENT, …
  std::uint8_t fProtocol = 0;  // IFAPROT_KERNEL_RA, …; 0: not reported
  TFinding<std::string> fPeer = TLink::WhyAbsent();
  TFinding<std::string> fBroadcast = TLink::WhyAbsent();
  TFinding<std::string> fLabel = TLink::WhyAbsent();
  TFinding<std::uint32_t> fPreferredSeconds = TLink::WhyAbsent();
  TFinding<std::uint32_t> fValidSeconds = TLink::WhyAbsent();

  // "eth0 10.0.2.15/24": unique on a machine.
  std::string Name() const;
};

struct TAddresses {
  std::vector<TAddress> fAll;
  std::optional<TMissing> fWhyNotAll;  // why there are no addresses, or not all
};

// The addresses in an answer to RTM_GETADDR: at most 1,000, of which no two have the same name. An address of an interface that
// `links` does not contain is left out.
TAddresses AddressesIn(std::string const& dump, TLinks const& links);

// From the answer "netlink/addresses".
TAddresses AddressesOf(TMachineFiles const& files, TLinks const& links);

// ZEP_IPProtocolEndpoint.
TRecord AddressRecord(TAddress const& address, TComputerSystem const& system);

// The text of an IP address: 4 bytes or 16. Missing for any other number of bytes.
TFinding<std::string> IpText(std::string_view bytes);

// "255.255.255.0" for 24, at most 32.
std::string MaskOf(unsigned prefixLength);

}  // namespace NQRVZEP20
