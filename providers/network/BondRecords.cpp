// SPDX-License-Identifier: Apache-2.0
#include "BondRecords.h"

#include <iterator>
#include <sstream>

namespace NQRVZEP20 {

namespace {

using TText = TFinding<std::string>;

constexpr TValueName kRedundancyStatuses[] = {
    {"2", "Fully Redundant"}, {"3", "Degraded Redundancy"}, {"4", "Redundancy Lost"}, {"5", "Overall Failure"}};
constexpr std::uint16_t kFullyRedundant = 2, kDegraded = 3, kRedundancyLost = 4, kFailed = 5;
constexpr TValueName kTypesOfSet[] = {{"1", "Other"}, {"3", "Load Balanced"}, {"4", "Sparing"}};
constexpr std::uint16_t kOtherSet = 1, kLoadBalanced = 3, kSparing = 4;
constexpr TValueName kAlgorithms[] = {{"1", "Other"}, {"2", "No Load Balancing"}, {"3", "Round Robin"}};
constexpr std::uint16_t kOtherAlgorithm = 1, kNoBalancing = 2, kRoundRobin = 3;
constexpr TValueName kInterfaceType[] = {{"161", "IEEE 802.3ad Link Aggregate"}};

// Settings that few bonds change.
constexpr char const* kOtherSettings[] = {
    "use_carrier", "arp_validate", "arp_all_targets",   "arp_missed_max", "primary_reselect",  "num_grat_arp", "peer_notif_delay",
    "resend_igmp", "lp_interval",  "packets_per_slave", "tlb_dynamic_lb", "all_slaves_active", "lacp_active"};

// The first word of a line such as "active-backup 1".
std::string FirstWord(std::string const& line) { return line.substr(0, line.find(' ')); }

TFinding<std::vector<std::string>> Words(TText const& line) {
  if (!line && line.Why().fCode == kMissingNotGiven) return std::vector<std::string>();  // the file is empty
  return line.Then([](std::string const& text) {
    std::istringstream stream(text);
    std::vector<std::string> words;
    for (std::string word; stream >> word;) words.push_back(word);
    return words;
  });
}

// "52:54:00:12:34:56" without the colons, as the schema writes addresses.
TText WithoutColons(TText const& address) {
  return address.Then([](std::string text) {
    std::string digits;
    for (char const c : text)
      if (c != ':') digits += c;
    return digits;
  });
}

TFinding<std::uint16_t> RedundancyOf(TMachineFiles const& files, std::vector<TLink const*> const& members) {
  std::size_t working = 0;
  for (TLink const* const member : members) {
    TText const state = TLinkFiles(files, *member).Line("bonding_slave/mii_status");
    if (!state) return state.Why();
    working += *state == "up";
  }
  if (working == 0) return kFailed;
  if (working == 1) return kRedundancyLost;
  return working == members.size() ? kFullyRedundant : kDegraded;
}

std::uint16_t TypeOfSet(std::string const& mode) {
  if (mode == "active-backup") return kSparing;
  return mode == "broadcast" ? kOtherSet : kLoadBalanced;
}

std::uint16_t AlgorithmOf(std::string const& mode) {
  if (mode == "balance-rr") return kRoundRobin;
  return mode == "active-backup" || mode == "broadcast" ? kNoBalancing : kOtherAlgorithm;
}

void AddSet(TRecord& record, TText const& mode, TText const& policy) {
  record.Add("TypeOfSet", mode.Then([](std::string const& of) { return std::vector<std::uint16_t>{TypeOfSet(of)}; }))
      .Names(kTypesOfSet);
  record.Add("LoadBalanceAlgorithm", mode.Then(AlgorithmOf)).Names(kAlgorithms);
  record.Add("OtherLoadBalanceAlgorithm", mode.Then([&](std::string const& of) -> TText {
    if (AlgorithmOf(of) != kOtherAlgorithm)
      return TMissing{kMissingNotApplicable, "LoadBalanceAlgorithm describes the mode " + of + " completely"};
    return policy ? of + ", " + *policy : of;
  }));
}

void AddLacp(TRecord& record, TLinkFiles const& files, TText const& mode) {
  bool const isLacp = mode && *mode == "802.3ad";
  TMissing const none{kMissingNotApplicable, "the bond does not use LACP"};
  auto const word = [&](char const* name) { return isLacp ? files.Line(name).Then(FirstWord) : TText(none); };
  record.Add("LACPRate", word("bonding/lacp_rate"));
  record.Add("AggregatorSelection", word("bonding/ad_select"));
  record.Add("AggregatorID", isLacp ? files.Number<std::uint32_t>("bonding/ad_aggregator") : none);
  record.Add("AggregatorPorts", isLacp ? files.Number<std::uint32_t>("bonding/ad_num_ports") : none);
  record.Add("PartnerMACAddress", WithoutColons(word("bonding/ad_partner_mac")));
}

// The bits of the state of a port, from the lowest, in the words of ip(8).
constexpr char const* kLacpStates[] = {"active",     "short_timeout", "aggregating", "in_sync",
                                       "collecting", "distributing",  "defaulted",   "expired"};

std::vector<std::string> LacpWords(std::uint16_t state) {
  std::vector<std::string> words;
  for (std::size_t bit = 0; bit < std::size(kLacpStates); ++bit)
    if (state >> bit & 1) words.emplace_back(kLacpStates[bit]);
  return words;
}

// The number in a file of a member, which reads N/A without LACP.
template <class T>
TFinding<T> LacpNumber(TLinkFiles const& files, char const* name) {
  return files.Line(name).Then([&](std::string const& line) -> TFinding<T> {
    if (line == "N/A") return TMissing{kMissingNotApplicable, "the bond does not use LACP"};
    return files.Number<T>(name);
  });
}

}  // namespace

bool IsBond(TLink const& link) { return link.IsKind("bond"); }

std::vector<TLink const*> MembersOf(TLink const& master, TLinks const& links) {
  std::vector<TLink const*> members;
  for (TLink const& link : links.fAll)
    if (link.fMaster && master.fIndex && *link.fMaster == *master.fIndex) members.push_back(&link);
  return members;
}

TRecord BondRecord(TMachineFiles const& files, TLink const& bond, TLinks const& links) {
  TLinkFiles const of(files, bond);
  auto const word = [&](char const* name) { return of.Line(name).Then(FirstWord); };
  auto const number = [&](char const* name) { return of.Number<std::uint32_t>(name); };
  auto const members = MembersOf(bond, links);
  TText const mode = word("bonding/mode");

  TRecord record("ZEP_Bond", "sysfs", "CIM_RedundancySet");
  record.AddKey("InstanceID", "bond " + bond.fName);
  record.AddOwn("ElementName", bond.fName);
  record.Add("RedundancyStatus", RedundancyOf(files, members)).Names(kRedundancyStatuses);
  AddSet(record, mode, word("bonding/xmit_hash_policy"));
  record.Add("Mode", mode);
  record.Add("NumberOfMembers", TFinding<std::uint32_t>(static_cast<std::uint32_t>(members.size())));
  record.Add("ActiveMember", of.Line("bonding/active_slave"));
  record.Add("PrimaryMember", of.Line("bonding/primary"));
  record.Add("MIIStatus", of.Line("bonding/mii_status"));
  record.Add("MIIMonitoringInterval", number("bonding/miimon")).Unit("second * 10^-3");
  record.Add("UpDelay", number("bonding/updelay")).Unit("second * 10^-3");
  record.Add("DownDelay", number("bonding/downdelay")).Unit("second * 10^-3");
  record.Add("ARPInterval", number("bonding/arp_interval")).Unit("second * 10^-3");
  record.Add("ARPTargets", Words(of.Line("bonding/arp_ip_target")));
  record.Add("MinimumLinks", number("bonding/min_links"));
  record.Add("FailOverMAC", word("bonding/fail_over_mac"));
  record.Add("TransmitHashPolicy", word("bonding/xmit_hash_policy"));
  AddLacp(record, of, mode);
  record.Add("OtherSettings", of.Settings("bonding", kOtherSettings));
  return record;
}

TRecord BondMemberRecord(TMachineFiles const& files, TLink const& member, TLinks const& links, TComputerSystem const& system) {
  TLinkFiles const of(files, member);
  TRecord record("ZEP_BondMember", "sysfs", "CIM_ProtocolEndpoint");
  system.AddHostedKeys(record, member.fName);
  record.AddOwn("ElementName", member.fName);
  record.Add("ProtocolIFType", TFinding<std::uint16_t>(std::uint16_t(161))).Names(kInterfaceType);
  record.Add("BondName", links.NameOf(member.fMaster));
  record.Add("MemberState", of.Line("bonding_slave/state"));
  record.Add("MIIStatus", of.Line("bonding_slave/mii_status"));
  record.Add("LinkFailures", of.Number<std::uint32_t>("bonding_slave/link_failure_count"));
  record.Add("PermanentAddress", WithoutColons(of.Line("bonding_slave/perm_hwaddr")));
  record.Add("QueueID", of.Number<std::uint16_t>("bonding_slave/queue_id"));
  record.Add("AggregatorID", LacpNumber<std::uint32_t>(of, "bonding_slave/ad_aggregator_id"));
  record.Add("LACPState", LacpNumber<std::uint16_t>(of, "bonding_slave/ad_actor_oper_port_state").Then(LacpWords));
  record.Add("PartnerLACPState", LacpNumber<std::uint16_t>(of, "bonding_slave/ad_partner_oper_port_state").Then(LacpWords));
  return record;
}

}  // namespace NQRVZEP20
