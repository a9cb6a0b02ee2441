// SPDX-License-Identifier: Apache-2.0
#include "collect/findings/Rules.h"

#include <algorithm>
#include <cstdio>
#include <map>
#include <optional>
#include <set>

namespace NQRVZEP20 {

namespace {

// The end of a link at a PCI function.
struct TLinkEnd {
  std::optional<std::uint64_t> fWidth, fMaxWidth;  // in lanes
  std::optional<double> fRate, fMaxRate;           // in gigatransfers per second
};

TLinkEnd LinkEndOf(TElement const& link) {
  return {link.Number("Width").fValue, link.Number("MaxWidth").fValue, link.Real("TransferRate").fValue,
          link.Real("MaxTransferRate").fValue};
}

std::string RateText(double rate) {
  char text[32];
  std::snprintf(text, sizeof text, "%g GT/s", rate);
  return text;
}

// The addresses of the functions below bridges, each with the address of its bridge.
std::map<std::string, std::string> BridgesOf(TRuleRun const& run) {
  std::map<std::string, std::string> bridges;
  for (TElement const& control : run.TryElements("CIM_ControlledBy")) {
    auto const bridge = control.KeyOf("Antecedent", "DeviceID"), function = control.KeyOf("Dependent", "DeviceID");
    if (bridge.IsKnown() && function.IsKnown()) bridges[*function.fValue] = *bridge.fValue;
  }
  return bridges;
}

// The address of a device: that of its functions without their number.
std::string DeviceOf(std::string const& function) { return function.substr(0, function.rfind('.')); }

// The devices with a display controller, and the bridges above them, such as the switch of a graphics card. They lower the rate
// of their links while they are idle.
std::set<std::string> DevicesOfDisplays(TRuleRun const& run, std::map<std::string, std::string> const& bridges) {
  constexpr std::uint64_t display = 3;
  std::set<std::string> devices;
  for (TElement const& function : run.TryElements("CIM_PCIDevice")) {
    auto const code = function.Number("ClassCode");
    if (!code.IsKnown() || *code.fValue != display) continue;
    std::string const address = function.NameIn("DeviceID");
    devices.insert(DeviceOf(address));
    auto bridge = bridges.find(address);
    while (bridge != bridges.end() && devices.insert(DeviceOf(bridge->second)).second) bridge = bridges.find(bridge->second);
  }
  return devices;
}

using TLinkEnds = std::map<std::string, TLinkEnd>;  // by address

// The functions of a device share its link, which is judged once, with the lowest function. Function 0 may be missing, such as in
// a virtual machine.
bool IsFirstFunction(std::string const& address, TLinkEnds const& ends) {
  return ends.lower_bound(DeviceOf(address))->first == address;
}

void AskPciLink(TRuleRun& run) {
  auto const links = run.Elements("ZEP_PCIExpressLink");
  auto const bridges = BridgesOf(run);
  auto const displays = DevicesOfDisplays(run, bridges);
  TLinkEnds ends;
  for (TElement const& link : links) ends[link.NameIn("DeviceID")] = LinkEndOf(link);

  for (TElement const& link : links) {
    std::string const address = link.NameIn("DeviceID");
    auto const bridge = bridges.find(address);
    if (bridge == bridges.end() || ends.count(bridge->second) == 0) continue;  // an end of no link, or its upper end
    if (!IsFirstFunction(address, ends)) continue;
    TLinkEnd const &lower = ends[address], &upper = ends[bridge->second];
    if (!lower.fWidth || *lower.fWidth == 0 || !lower.fMaxWidth || !upper.fMaxWidth) continue;
    run.Know(link, link.Number("Width"));
    std::string const name = "the PCI Express link of " + address;
    std::uint64_t const lanes = std::min(*lower.fMaxWidth, *upper.fMaxWidth);
    if (*lower.fWidth < lanes)
      run.Add(link, link.Number("Width").fSource, ESeverity::kWarning,
              name + " has " + std::to_string(*lower.fWidth) + " of the " + std::to_string(lanes) + " lanes that both ends have",
              "Seat the card anew; check the riser and the settings of the slot in the firmware.");
    if (!lower.fRate || !lower.fMaxRate || !upper.fMaxRate || displays.count(DeviceOf(address)) != 0) continue;
    double const rate = std::min(*lower.fMaxRate, *upper.fMaxRate);
    if (*lower.fRate < rate)
      run.Add(link, link.Real("TransferRate").fSource, ESeverity::kWarning,
              name + " runs at " + RateText(*lower.fRate) + ", although both ends can run at " + RateText(rate),
              "Seat the card anew; check the riser and the settings of the slot in the firmware.");
  }
}

}  // namespace

std::vector<TRule> DeviceRules() {
  return {{"pci-link", "Is a PCI Express link narrower or slower than both ends allow?", AskPciLink}};
}

}  // namespace NQRVZEP20
