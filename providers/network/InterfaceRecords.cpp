// SPDX-License-Identifier: Apache-2.0
#include "InterfaceRecords.h"

#include "LinkState.h"

#include <linux/if_arp.h>
#include <linux/if_vlan.h>

#include <iterator>

namespace NQRVZEP20 {

namespace {

using TTexts = TFinding<std::vector<std::string>>;

// ---- Types ----

constexpr TValueName kInterfaceTypes[] = {{"1", "Other"},
                                          {"6", "Ethernet CSMA/CD"},
                                          {"23", "PPP"},
                                          {"24", "Software Loopback"},
                                          {"53", "Proprietary Virtual/Internal"},
                                          {"131", "Tunnel"},
                                          {"135", "Layer 2 VLAN using 802.1Q"},
                                          {"161", "IEEE 802.3ad Link Aggregate"},
                                          {"199", "Infiniband"},
                                          {"209", "Transparent Bridge"}};

struct TInterfaceType {
  char const* fName;
  std::uint16_t fType;
};

constexpr TInterfaceType kTypesOfKinds[] = {
    {"bond", 161},      {"bridge", 209}, {"geneve", 131}, {"gre", 131},   {"gretap", 131}, {"ip6gre", 131},
    {"ip6gretap", 131}, {"ip6tnl", 131}, {"ipip", 131},   {"ipoib", 199}, {"ppp", 23},     {"sit", 131},
    {"team", 161},      {"tun", 131},    {"vlan", 135},   {"vti", 131},   {"vxlan", 131},  {"wireguard", 131},
};

std::uint16_t TypeOfKind(std::string const& kind) {
  constexpr std::uint16_t kVirtual = 53;
  for (TInterfaceType const& known : kTypesOfKinds)
    if (kind == known.fName) return known.fType;
  return kVirtual;
}

struct TLinkType {
  std::uint16_t fNumber;
  char const* fWord;
  std::uint16_t fType;
};

constexpr TLinkType kLinkTypes[] = {
    {ARPHRD_ETHER, "ether", 6},        {ARPHRD_INFINIBAND, "infiniband", 199},
    {ARPHRD_LOOPBACK, "loopback", 24}, {ARPHRD_PPP, "ppp", 23},
    {ARPHRD_TUNNEL, "ipip", 131},      {ARPHRD_TUNNEL6, "tunnel6", 131},
    {ARPHRD_SIT, "sit", 131},          {ARPHRD_IPGRE, "gre", 131},
    {ARPHRD_IP6GRE, "gre6", 131},      {ARPHRD_NONE, "none", 1},
};

TLinkType const* FindLinkType(std::uint16_t number) {
  for (TLinkType const& known : kLinkTypes)
    if (known.fNumber == number) return &known;
  return nullptr;
}

TFinding<std::uint16_t> InterfaceTypeOf(TLink const& link) {
  if (link.fKind) return TypeOfKind(*link.fKind);
  return link.fType.Then([](std::uint16_t number) {
    TLinkType const* const type = FindLinkType(number);
    return type != nullptr ? type->fType : std::uint16_t(1);
  });
}

TFinding<std::string> LinkTypeOf(TLink const& link) {
  return link.fType.Then([](std::uint16_t number) {
    TLinkType const* const type = FindLinkType(number);
    return type != nullptr ? std::string(type->fWord) : "type " + std::to_string(number);
  });
}

// ---- Values ----

template <class T>
TFinding<T> Or(TFinding<T> const& value, char const* code, char const* reason) {
  return value ? value : TMissing{code, reason};
}

TFinding<std::uint32_t> BitsOf(TFinding<std::uint32_t> const& bytes) {
  return bytes.Then([](std::uint32_t count) -> TFinding<std::uint32_t> {
    if (count > UINT32_MAX / 8)
      return TMissing{kMissingUnexpected, "the MTU of " + std::to_string(count) + " bytes is too large"};
    return count * 8;
  });
}

TFinding<std::uint32_t> LimitOf(TFinding<std::uint32_t> const& mtu) {
  return mtu.Then([](std::uint32_t bytes) -> TFinding<std::uint32_t> {
    if (bytes == 0) return TMissing{kMissingNotGiven, "the driver sets no limit"};
    return bytes;
  });
}

TFinding<std::string> LinkModeOf(TLink const& link) {
  return link.fLinkMode.Then([](std::uint8_t mode) -> TFinding<std::string> {
    constexpr char const* kModes[] = {"default", "dormant", "testing"};
    if (mode < std::size(kModes)) return std::string(kModes[mode]);
    return TMissing{kMissingUnexpected, std::to_string(mode) + " is not a link mode"};
  });
}

void AddQueues(TRecord& record, TLink const& link) {
  record.Add("QueueDiscipline", link.fQueueDiscipline);
  record.Add("TransmitQueueLength", link.fQueueLength);
  record.Add("TransmitQueues", link.fSendQueues);
  record.Add("ReceiveQueues", link.fReceiveQueues);
}

void AddRelatives(TRecord& record, TLink const& link, TLinks const& links) {
  record.Add("MasterInterface",
             link.fMaster ? links.NameOf(link.fMaster)
                          : TMissing{kMissingNotApplicable, "the interface is not a member of a bond, bridge or the like"});
  record.Add("LowerInterface", link.fLower || link.fLower.Why().fCode == kMissingNotApplicable
                                   ? links.NameOf(link.fLower)
                                   : TMissing{kMissingNotApplicable, "the interface is not on top of another one"});
}

// A counter of the schema, which has 32 bits.
TFinding<std::uint32_t> Narrow(TFinding<std::uint64_t> const& counter) {
  return counter.Then([](std::uint64_t count) -> TFinding<std::uint32_t> {
    if (count > UINT32_MAX) return TMissing{kMissingUnexpected, std::to_string(count) + " exceeds the 32 bits of the property"};
    return static_cast<std::uint32_t>(count);
  });
}

struct TCounterProperty {
  char const* fName;
  std::uint64_t TLinkCounters::*fMember;
};

constexpr TCounterProperty kCountersOf32Bits[] = {
    {"AlignmentErrors", &TLinkCounters::fFrameErrors},   {"FCSErrors", &TLinkCounters::fCrcErrors},
    {"LateCollisions", &TLinkCounters::fWindowErrors},   {"ExcessiveCollisions", &TLinkCounters::fAbortedErrors},
    {"SQETestErrors", &TLinkCounters::fHeartbeatErrors}, {"CarrierSenseErrors", &TLinkCounters::fCarrierErrors}};
constexpr TCounterProperty kBytes[] = {{"BytesTransmitted", &TLinkCounters::fSentBytes},
                                       {"BytesReceived", &TLinkCounters::fReceivedBytes}};
constexpr TCounterProperty kCounters[] = {
    {"PacketsTransmitted", &TLinkCounters::fSentPackets},      {"PacketsReceived", &TLinkCounters::fReceivedPackets},
    {"ReceiveErrors", &TLinkCounters::fReceiveErrors},         {"TransmitErrors", &TLinkCounters::fSendErrors},
    {"ReceiveDrops", &TLinkCounters::fReceiveDrops},           {"TransmitDrops", &TLinkCounters::fSendDrops},
    {"MulticastPackets", &TLinkCounters::fMulticast},          {"Collisions", &TLinkCounters::fCollisions},
    {"ReceiveLengthErrors", &TLinkCounters::fLengthErrors},    {"ReceiveOverrunErrors", &TLinkCounters::fOverErrors},
    {"ReceiveFIFOErrors", &TLinkCounters::fReceiveFifoErrors}, {"ReceiveMissedErrors", &TLinkCounters::fMissedErrors},
    {"TransmitFIFOErrors", &TLinkCounters::fSendFifoErrors}};

}  // namespace

TRecord InterfaceRecord(TLink const& link, TLinks const& links, TComputerSystem const& system) {
  TRecord record("ZEP_NetworkInterface", links.fSource, "CIM_LANEndpoint");
  system.AddHostedKeys(record, link.fName);
  record.Add("ElementName", TFinding<std::string>(link.fName));
  record.Add("ProtocolIFType", InterfaceTypeOf(link)).Names(kInterfaceTypes);
  AddState(record, link);
  record.Add("MACAddress", link.fAddress);
  record.Add("MaxDataSize", BitsOf(link.fMtu));

  record.Add("InterfaceIndex", link.fIndex);
  record.Add("LinkType", LinkTypeOf(link));
  record.Add("Kind", Or(link.fKind, kMissingNotApplicable, "the kernel reports a kind only for virtual interfaces"));
  record.Add("OperationalState", OperationalWordOf(link));
  record.Add("LinkMode", LinkModeOf(link));
  record.Add("Flags", FlagWordsOf(link));
  record.Add("MTU", link.fMtu).Unit("byte");
  record.Add("MinimumMTU", LimitOf(link.fMinMtu)).Unit("byte");
  record.Add("MaximumMTU", LimitOf(link.fMaxMtu)).Unit("byte");
  record.Add("BroadcastAddress", link.fBroadcast);
  AddQueues(record, link);
  record.Add("Promiscuity", link.fPromiscuity);
  record.Add("InterfaceGroup", link.fGroup);
  record.Add("CarrierChanges", link.fCarrierChanges);
  record.Add("Alias", Or(link.fAlias, kMissingNotApplicable, "no alias is set"));
  record.Add("AlternativeNames", TTexts(link.fOtherNames));
  AddRelatives(record, link, links);
  return record;
}

TRecord StatisticsRecord(TLink const& link, std::string const& source) {
  TRecord record("ZEP_InterfaceStatistics", source, "CIM_EthernetPortStatistics");
  record.AddKey("InstanceID", "statistics of " + link.fName);
  record.AddOwn("ElementName", link.fName);
  auto const counter = [&](TCounterProperty const& property) {
    return link.fCounters.Then([&](TLinkCounters const& counters) { return counters.*property.fMember; });
  };
  for (TCounterProperty const& property : kBytes) record.Add(property.fName, counter(property)).Unit("byte");
  for (TCounterProperty const& property : kCounters) record.Add(property.fName, counter(property));
  for (TCounterProperty const& property : kCountersOf32Bits) record.Add(property.fName, Narrow(counter(property)));
  return record;
}

// ---- VLANs ----

namespace {

constexpr TValueName kVlanInterfaceType[] = {{"135", "Layer 2 VLAN using 802.1Q"}};

TFinding<std::string> VlanProtocolOf(TLink const& link) {
  return link.fVlanProtocol.Then([](std::uint16_t protocol) -> TFinding<std::string> {
    if (protocol == 0x8100) return std::string("802.1Q");
    if (protocol == 0x88A8) return std::string("802.1ad");
    return TMissing{kMissingUnexpected, std::to_string(protocol) + " is not the number of a VLAN protocol"};
  });
}

TTexts VlanFlagsOf(TLink const& link) {
  constexpr struct {
    std::uint32_t fBit;
    char const* fWord;
  } kFlags[] = {{VLAN_FLAG_REORDER_HDR, "REORDER_HDR"},
                {VLAN_FLAG_GVRP, "GVRP"},
                {VLAN_FLAG_LOOSE_BINDING, "LOOSE_BINDING"},
                {VLAN_FLAG_MVRP, "MVRP"},
                {VLAN_FLAG_BRIDGE_BINDING, "BRIDGE_BINDING"}};
  return link.fVlanFlags.Then([&](std::uint32_t flags) {
    std::vector<std::string> words;
    for (auto const& flag : kFlags)
      if ((flags & flag.fBit) != 0) words.emplace_back(flag.fWord);
    return words;
  });
}

}  // namespace

TRecord VlanRecord(TLink const& link, TLinks const& links, TComputerSystem const& system) {
  TRecord record("ZEP_VLANEndpoint", links.fSource, "CIM_VLANEndpoint");
  system.AddHostedKeys(record, link.fName);
  record.Add("ElementName", TFinding<std::string>(link.fName));
  record.Add("ProtocolIFType", TFinding<std::uint16_t>(std::uint16_t(135))).Names(kVlanInterfaceType);
  record.Add("VLANID", link.fVlanId);
  record.Add("VLANProtocol", VlanProtocolOf(link));
  record.Add("VLANFlags", VlanFlagsOf(link));
  record.Add("LowerInterface", links.NameOf(link.fLower));
  return record;
}

}  // namespace NQRVZEP20
