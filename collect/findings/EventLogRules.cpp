// SPDX-License-Identifier: Apache-2.0
#include "collect/findings/AgeText.h"
#include "collect/findings/ControllerElements.h"
#include "collect/findings/Rules.h"

#include <map>

namespace NQRVZEP20 {

namespace {

// Critical entries with the same text.
struct TEvents {
  TElement fNewest;
  std::string fSource;
  std::uint64_t fAge;  // of the newest, in seconds
  std::size_t fCount;
};

// The text without the reading, which differs from entry to entry.
std::string EventOf(std::string const& text) { return text.substr(0, text.find("; reading ")); }

void AskEvents(TRuleRun& run) {
  constexpr std::uint64_t critical = 6;
  std::map<std::string, TEvents> byText;
  NoteUnread(run, "event log");
  for (TElement const& log : run.TryElements("ZEP_EventLog")) run.Know(log, log.Number("CurrentNumberOfRecords"));
  for (TElement const& entry : OfController(run, "ZEP_EventLogEntry")) {
    auto const severity = entry.Number("PerceivedSeverity"), age = entry.Number("Age");
    auto const hasEnded = entry.Flag("HasEnded");
    auto const text = entry.Text("RecordData");
    bool const isCritical = run.Know(entry, severity) && *severity.fValue >= critical && hasEnded.IsKnown() && !*hasEnded.fValue;
    if (!isCritical || !run.Know(entry, age) || !run.Know(entry, text)) continue;
    if (*age.fValue > run.Thresholds().fEventLogDays * kSecondsOfADay) continue;
    TEvents& events = byText.try_emplace(EventOf(*text.fValue), TEvents{entry, text.fSource, *age.fValue, 0}).first->second;
    ++events.fCount;
    if (*age.fValue <= events.fAge) events.fNewest = entry, events.fAge = *age.fValue;
  }
  for (auto const& [text, events] : byText) {
    std::string const often = events.fCount > 1 ? ", the last of " + std::to_string(events.fCount) : "";
    run.Add(events.fNewest, events.fSource, ESeverity::kError,
            "the controller's event log has a critical entry: " + text + " (" + AgeText(events.fAge) + often + ")",
            "Check the part that this sensor watches, its power and its cooling, and replace it if the event happens again. "
            "After the repair, clear the event log (ipmitool sel clear).");
  }
}

void AskLogFull(TRuleRun& run) {
  for (TElement const& log : OfController(run, "ZEP_EventLog")) {
    auto const free = log.Number("FreeRecords");
    auto const hasLost = log.Flag("HasLostRecords");
    bool const isFull = run.Know(log, free) && *free.fValue == 0;
    if (isFull || (run.Know(log, hasLost) && *hasLost.fValue))
      run.Add(log, isFull ? free.fSource : hasLost.fSource, ESeverity::kWarning,
              isFull ? "the controller's event log is full, so that new events are lost"
                     : "the controller's event log was full, and has lost events",
              "Save its entries to a file (ipmitool sel save FILE), then clear it (ipmitool sel clear).");
  }
}

void AskClock(TRuleRun& run) {
  for (TElement const& log : OfController(run, "ZEP_EventLog")) {
    auto const clock = log.Value("ClockTime");
    if (clock.IsKnown() || clock.fMissing.fCode != kMissingPlaceholder)
      run.Know(log, clock);
    else
      run.Add(log, clock.fSource, ESeverity::kWarning, "the clock of the management controller is not set",
              "Set it (ipmitool sel time set now), so that events in its log have dates.");
  }
}

}  // namespace

std::vector<TRule> EventLogRules() {
  return {{"event-log-critical", "Does the controller's event log have a critical entry?", AskEvents},
          {"event-log-full", "Is the controller's event log full?", AskLogFull},
          {"controller-clock", "Is the clock of the management controller set?", AskClock}};
}

}  // namespace NQRVZEP20
