// SPDX-License-Identifier: Apache-2.0
#include "LinkState.h"

#include "providers/reasons/OperationalStatusNames.h"

#include <linux/if.h>

#include <iterator>

namespace NQRVZEP20 {

namespace {

constexpr TValueName kEnabledStates[] = {{"2", "Enabled"}, {"3", "Disabled"}, {"6", "Enabled but Offline"}, {"7", "In Test"}};

constexpr std::uint16_t kEnabled = 2, kDisabled = 3, kOffline = 6, kInTest = 7;
constexpr std::uint16_t kUnknown = 0, kOk = 2, kStopped = 10, kNoContact = 12, kDormant = 15, kLowerInError = 16;

struct TOperState {
  char const* fWord;
  std::uint16_t fStatus;
  char const* fDescription;
};

// By number: IF_OPER_UNKNOWN to IF_OPER_UP.
constexpr TOperState kOperStates[] = {
    {"unknown", kUnknown, "the driver does not report an operational state"},
    {"notpresent", kStopped, "a part of the interface is not present"},
    {"down", kNoContact, "no carrier"},
    {"lowerlayerdown", kLowerInError, "the interface below is down"},
    {"testing", kUnknown, "in test"},
    {"dormant", kDormant, "the carrier is present; waiting for an event, such as authentication"},
    {"up", kOk, "up"},
};

struct TFlag {
  std::uint32_t fBit;
  char const* fWord;
};

constexpr TFlag kFlags[] = {
    {IFF_LOOPBACK, "LOOPBACK"},   {IFF_BROADCAST, "BROADCAST"},   {IFF_POINTOPOINT, "POINTOPOINT"},
    {IFF_MULTICAST, "MULTICAST"}, {IFF_NOARP, "NOARP"},           {IFF_ALLMULTI, "ALLMULTI"},
    {IFF_PROMISC, "PROMISC"},     {IFF_MASTER, "MASTER"},         {IFF_SLAVE, "SLAVE"},
    {IFF_DEBUG, "DEBUG"},         {IFF_DYNAMIC, "DYNAMIC"},       {IFF_AUTOMEDIA, "AUTOMEDIA"},
    {IFF_PORTSEL, "PORTSEL"},     {IFF_NOTRAILERS, "NOTRAILERS"}, {IFF_UP, "UP"},
    {IFF_LOWER_UP, "LOWER_UP"},   {IFF_DORMANT, "DORMANT"},       {IFF_ECHO, "ECHO"},
};

bool IsUp(TLink const& link) { return link.fFlags && (*link.fFlags & IFF_UP) != 0; }

TFinding<TOperState> OperStateOf(TLink const& link) {
  return link.fOperState.Then([](std::uint8_t number) -> TFinding<TOperState> {
    if (number < std::size(kOperStates)) return kOperStates[number];
    return TMissing{kMissingUnexpected, std::to_string(number) + " is not an operational state"};
  });
}

TFinding<std::uint16_t> EnabledStateOf(TLink const& link) {
  if (!link.fFlags) return link.fFlags.Why();
  if (!IsUp(link)) return kDisabled;
  if (link.fOperState && *link.fOperState == IF_OPER_TESTING) return kInTest;
  if (!link.fHasCarrier) return link.fHasCarrier.Why();
  return *link.fHasCarrier ? kEnabled : kOffline;
}

// The state and its description. Many drivers, such as that of the loopback interface, report only the carrier.
TFinding<TOperState> StatusOf(TLink const& link) {
  if (link.fFlags && !IsUp(link)) return TOperState{"down", kStopped, "switched off"};
  bool const isUnknown = link.fOperState && *link.fOperState == IF_OPER_UNKNOWN;
  if (isUnknown && link.fHasCarrier && *link.fHasCarrier) return TOperState{"unknown", kOk, "up"};
  return OperStateOf(link);
}

}  // namespace

void AddState(TRecord& record, TLink const& link) {
  auto const status = StatusOf(link);
  record.Add("EnabledState", EnabledStateOf(link)).Names(kEnabledStates);
  record.Add("OperationalStatus", status.Then([](TOperState const& of) { return std::vector<std::uint16_t>{of.fStatus}; }))
      .Names(kOperationalStatusNames);
  record.Add("StatusDescriptions", status.Then([](TOperState const& of) { return std::vector<std::string>{of.fDescription}; }));
}

TFinding<std::string> OperationalWordOf(TLink const& link) {
  return OperStateOf(link).Then([](TOperState const& state) { return std::string(state.fWord); });
}

TFinding<std::vector<std::string>> FlagWordsOf(TLink const& link) {
  return link.fFlags.Then([](std::uint32_t flags) {
    std::vector<std::string> words;
    for (TFlag const& flag : kFlags)
      if ((flags & flag.fBit) != 0) words.emplace_back(flag.fWord);
    return words;
  });
}

}  // namespace NQRVZEP20
