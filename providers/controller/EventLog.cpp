// SPDX-License-Identifier: Apache-2.0
#include "EventLog.h"

#include "TBytes.h"

#include <algorithm>
#include <set>

namespace NQRVZEP20 {

namespace {

constexpr std::uint8_t kGetInfo = 0x40, kGetEntry = 0x43, kGetTime = 0x48;
constexpr std::uint16_t kFirstEntry = 0x0000, kNoMoreEntries = 0xFFFF;
constexpr std::size_t kInfoLength = 14, kMostEntries = 20000;
constexpr std::uint16_t kUnknownRoom = 0xFFFF;  // "65535 or more"

TFinding<std::uint64_t> ClockFrom(TIpmi const& ipmi) {
  return Ask(ipmi, {kStorage, kGetTime}, 4).Then([](std::string const& answer) -> TFinding<std::uint64_t> {
    TSelTime const time = SelTimeFrom(TBytes(answer).Long(0));
    if (time.fKind == TSelTime::EKind::kDate) return time.fSeconds;
    return TMissing{kMissingPlaceholder, "the clock of the controller is not set"};
  });
}

TFinding<std::uint64_t> RoomFrom(TBytes const& info) {
  if (info.Word(3) == kUnknownRoom) return TMissing{kMissingNotGiven, "the controller does not count the free space"};
  return static_cast<std::uint64_t>(info.Word(3) / kSelEntryLength);
}

TFinding<std::string> EntryAt(TIpmi const& ipmi, std::uint16_t id) {
  TIpmiRequest const request{
      kStorage, kGetEntry, {'\0', '\0', static_cast<char>(id & 0xFF), static_cast<char>(id >> 8), '\0', '\xFF'}};
  return Ask(ipmi, request, 2 + kSelEntryLength);
}

void ReadEntries(TEventLog& log, TIpmi const& ipmi, TProgress const& progress) {
  std::set<std::uint16_t> seen;
  std::uint16_t id = kFirstEntry;
  do {
    auto const answer = EntryAt(ipmi, id);
    if (!answer) {
      log.fIsComplete = answer.Why();
      return;
    }
    log.fEntries.push_back(*SelEntryFrom(std::string_view(*answer).substr(2)));
    progress("event log entries", log.fEntries.size(), std::max<std::size_t>(log.fEntries.size(), log.fCount));
    id = TBytes(*answer).Word(0);
  } while (id != kNoMoreEntries && seen.insert(id).second && log.fEntries.size() < kMostEntries);
  if (id != kNoMoreEntries) log.fIsComplete = TMissing{kMissingUnexpected, "the event log has no end"};
}

}  // namespace

TFinding<TEventLog> ReadEventLog(TIpmi const& ipmi, TProgress const& progress) {
  auto const info = Ask(ipmi, {kStorage, kGetInfo}, kInfoLength);
  if (!info) return info.Why();
  TBytes const bytes(*info);
  TEventLog log;
  log.fCount = bytes.Word(1);
  log.fRoomFor = RoomFrom(bytes);
  log.fHasLostEntries = (bytes.At(13) & 0x80) != 0;
  log.fClock = ClockFrom(ipmi);
  if (log.fCount > 0) ReadEntries(log, ipmi, progress);
  return log;
}

}  // namespace NQRVZEP20
