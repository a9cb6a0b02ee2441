// SPDX-License-Identifier: Apache-2.0
#include "collect/findings/Rules.h"

#include <algorithm>
#include <cstdlib>
#include <set>

namespace NQRVZEP20 {

namespace {

constexpr char const* kCheckCable = "Check the cable, the transceivers and the port of the switch.";

bool Has(std::vector<std::string> const& codes, std::string const& code) {
  for (std::string const& each : codes)
    if (each == code) return true;
  return false;
}

bool IsUp(TElement const& port) {
  auto const status = port.Texts("OperationalStatus");
  return status.IsKnown() && Has(*status.fValue, "2");
}

bool IsSwitchedOn(TElement const& port) {
  constexpr char const *enabled = "2", *enabledButOffline = "6";
  auto const state = port.Text("EnabledState");
  return state.IsKnown() && (*state.fValue == enabled || *state.fValue == enabledButOffline);
}

std::uint64_t SumOf(TElement const& statistics, std::initializer_list<char const*> properties) {
  std::uint64_t sum = 0;
  for (char const* property : properties) {
    auto const count = statistics.Number(property);
    sum += count.IsKnown() ? *count.fValue : 0;
  }
  return sum;
}

void AskPortErrors(TRuleRun& run) {
  constexpr std::uint64_t million = 1000000, fewest = 10;  // a handful of errors happens when a cable is plugged in
  for (TElement const& statistics : run.Elements("ZEP_InterfaceStatistics")) {
    if (!run.Know(statistics, statistics.Number("ReceiveErrors"))) continue;
    std::uint64_t const errors = SumOf(statistics, {"ReceiveErrors", "TransmitErrors"});
    std::uint64_t const packets = SumOf(statistics, {"PacketsReceived", "PacketsTransmitted"}) + errors;
    if (errors < fewest || errors * million / packets < run.Thresholds().fPortErrorsPerMillion) continue;
    run.Add(statistics, statistics.Number("ReceiveErrors").fSource, ESeverity::kWarning,
            "the network interface " + statistics.Label() + " has had " + std::to_string(errors) + " errors in " +
                std::to_string(packets) + " packets since the start",
            kCheckCable + std::string(" The counters begin at 0 when the driver of the interface is loaded again (modprobe -r, "
                                      "modprobe), or when the machine is restarted."));
  }
}

void AskHalfDuplex(TRuleRun& run) {
  for (TElement const& port : run.Elements("CIM_EthernetPort")) {
    if (!IsUp(port)) continue;
    auto const isFull = port.Flag("FullDuplex");
    if (run.Know(port, isFull) && !*isFull.fValue)
      run.Add(port, isFull.fSource, ESeverity::kWarning, "the network port " + port.Label() + " uses half duplex",
              "Let both ends negotiate the link, or set the same mode at both.");
  }
}

constexpr std::uint64_t kMegabit = 1000000;

// "1000baseT/Full" begins with the speed in Mbit/s.
std::uint64_t SpeedOfMode(std::string const& mode) { return std::strtoull(mode.c_str(), nullptr, 10) * kMegabit; }

// The highest speed that both ends of the port advertise; 0 if that of one end is unknown.
std::uint64_t HighestCommonSpeed(TRuleRun const& run, std::string const& port) {
  std::uint64_t highest = 0;
  for (TElement const& capabilities : run.TryElements("ZEP_EthernetPortCapabilities")) {
    auto const own = capabilities.Texts("AdvertisedLinkModes"), partners = capabilities.Texts("PartnerLinkModes");
    if (capabilities.Label() != port || !own.IsKnown() || !partners.IsKnown()) continue;
    for (std::string const& mode : *own.fValue)
      if (Has(*partners.fValue, mode)) highest = std::max(highest, SpeedOfMode(mode));
  }
  return highest;
}

// Many fast ports are connected to slower switches on purpose. Two ends that advertise more than they use have a bad cable. If
// the modes of the other end are unknown, a port at 100 Mbit/s is judged: a broken pair of a cable causes that.
void AskSlowPort(TRuleRun& run) {
  constexpr std::uint64_t fast = 100 * kMegabit, gigabit = 1000 * kMegabit;
  for (TElement const& port : run.Elements("CIM_EthernetPort")) {
    if (!IsUp(port)) continue;
    auto const speed = port.Number("Speed"), highest = port.Number("MaxSpeed");
    if (!run.Know(port, speed) || !run.Know(port, highest)) continue;
    std::uint64_t const common = HighestCommonSpeed(run, port.Label());
    bool const isSlow = common > 0 ? *speed.fValue < common : *speed.fValue <= fast && *highest.fValue >= gigabit;
    if (isSlow)
      run.Add(port, speed.fSource, ESeverity::kWarning,
              "the network port " + port.Label() + " runs at " + std::to_string(*speed.fValue / kMegabit) + " Mbit/s, although " +
                  (common > 0 ? "both ends advertise " : "it can run at ") +
                  std::to_string((common > 0 ? common : *highest.fValue) / kMegabit),
              kCheckCable);
  }
}

// The interfaces that something depends on: those with an address, and the members of bridges. Members of bonds have a rule of
// their own.
std::set<std::string> InterfacesInUse(TRuleRun const& run) {
  std::set<std::string> names;
  for (TElement const& address : run.TryElements("CIM_IPProtocolEndpoint")) {
    auto const name = address.Text("InterfaceName"), origin = address.Text("AddressOrigin");
    constexpr char const *ipv4LinkLocal = "6", *ipv6LinkLocal = "10";  // the kernel and its services set these by themselves
    bool const isSetOnPurpose = origin.IsKnown() && *origin.fValue != ipv4LinkLocal && *origin.fValue != ipv6LinkLocal;
    if (name.IsKnown() && isSetOnPurpose) names.insert(*name.fValue);
  }
  for (TElement const& port : run.TryElements("ZEP_BridgePort")) names.insert(port.Label());
  return names;
}

void AskUnpluggedPort(TRuleRun& run) {
  auto const inUse = InterfacesInUse(run);
  for (TElement const& port : run.Elements("CIM_EthernetPort")) {
    auto const status = port.Texts("OperationalStatus");
    if (!run.Know(port, status) || !IsSwitchedOn(port) || IsUp(port) || inUse.count(port.Label()) == 0) continue;
    run.Add(port, status.fSource, ESeverity::kError, "the network port " + port.Label() + " is in use, but has no link",
            kCheckCable);
  }
}

std::set<std::string> InterfacesSwitchedOff(TRuleRun const& run) {
  std::set<std::string> names;
  for (TElement const& interface : run.TryElements("ZEP_NetworkInterface")) {
    auto const state = interface.Text("EnabledState");
    if (state.IsKnown() && *state.fValue == "3") names.insert(interface.Label());
  }
  return names;
}

std::string SwitchOn(std::string const& interface) { return "Switch it on (ip link set dev " + interface + " up)"; }

// The members of a bond that is switched off have no link, either.
void AskBondMembers(TRuleRun& run, std::set<std::string> const& off) {
  for (TElement const& member : run.Elements("ZEP_BondMember")) {
    auto const status = member.Text("MIIStatus"), bond = member.Text("BondName");
    if (!run.Know(member, status) || *status.fValue == "up" || (bond.IsKnown() && off.count(*bond.fValue) > 0)) continue;
    bool const isOff = off.count(member.Label()) > 0;
    run.Add(member, status.fSource, ESeverity::kError,
            "the bond " + (bond.IsKnown() ? *bond.fValue : "") + " lacks its member " + member.Label() +
                (isOff ? ", which is switched off" : ", which has no link"),
            isOff ? SwitchOn(member.Label()) + "." : kCheckCable);
  }
}

// The kernel makes a bond without members, switched off, when it loads the module.
void AskBonds(TRuleRun& run, std::set<std::string> const& off) {
  for (TElement const& bond : run.TryElements("ZEP_Bond")) {
    auto const members = bond.Number("NumberOfMembers");
    if (!run.Know(bond, members)) continue;
    bool const isOff = off.count(bond.Label()) > 0;
    if (isOff && *members.fValue > 0)
      run.Add(bond, members.fSource, ESeverity::kWarning,
              "the bond " + bond.Label() + " is switched off, although it has members",
              SwitchOn(bond.Label()) + ", or remove it if it is not needed.");
    else if (!isOff && *members.fValue < 2)
      run.Add(bond, members.fSource, ESeverity::kWarning,
              "the bond " + bond.Label() + (*members.fValue == 0 ? " has no member" : " has only one member"),
              "Add the interfaces that belong to it.");
  }
}

void AskBond(TRuleRun& run) {
  auto const off = InterfacesSwitchedOff(run);
  AskBondMembers(run, off);
  AskBonds(run, off);
}

}  // namespace

std::vector<TRule> NetworkRules() {
  return {{"port-errors", "Does a network interface count errors?", AskPortErrors},
          {"port-half-duplex", "Does a network port use half duplex?", AskHalfDuplex},
          {"port-slow", "Is a network port below its speed?", AskSlowPort},
          {"port-unplugged", "Does a network port that is in use have no link?", AskUnpluggedPort},
          {"bond-member", "Does a bond lack a member?", AskBond}};
}

}  // namespace NQRVZEP20
