// SPDX-License-Identifier: Apache-2.0
#include "collect/findings/AgeText.h"
#include "collect/findings/ControllerElements.h"
#include "collect/findings/Rules.h"

#include <algorithm>
#include <iterator>
#include <map>

namespace NQRVZEP20 {

namespace {

// How critical entries are judged that are not about a broken part.
struct TJudgement {
  char const* fType;  // of the sensor
  ESeverity fSeverity;
  char const* fRemedy;
};
constexpr TJudgement kPartJudgement = {
    "", ESeverity::kError,
    "Check the part that this sensor watches, its power and its cooling, and replace it if the event happens again."};
constexpr TJudgement kRemoval = {"", ESeverity::kWarning, "Insert the part again, unless it was removed on purpose."};
constexpr char const* kReadSystemLog = "Search the log of the operating system for the cause.";
constexpr TJudgement kOtherJudgements[] = {
    {"Physical Security", ESeverity::kWarning, "Check that the machine is closed and connected, and who had access to it."},
    {"Platform Security Violation Attempt", ESeverity::kWarning, "Find out who entered a wrong password."},
    {"Session Audit", ESeverity::kWarning, "Find out who entered a wrong password at the controller."},
    {"Event Logging Disabled", ESeverity::kInformation, "Switch the logging on again, unless it is off on purpose."},
    {"Boot Error", ESeverity::kWarning, "Check the order of the boot devices, and whether the chosen one can be read."},
    {"OS Boot", ESeverity::kWarning, kReadSystemLog},
    {"OS Critical Stop", ESeverity::kWarning, kReadSystemLog},
    {"Watchdog 1", ESeverity::kWarning, kReadSystemLog},
    {"Watchdog 2", ESeverity::kWarning, kReadSystemLog},
    {"Entity Presence", kRemoval.fSeverity, kRemoval.fRemedy}};

TJudgement const& JudgementOf(TElement const& entry, std::string const& text) {
  if (text.find(": Device Removed/Device Absent") != std::string::npos) return kRemoval;
  auto const type = entry.Text("SensorTypeName");
  auto const* const found = std::find_if(std::begin(kOtherJudgements), std::end(kOtherJudgements),
                                         [&](TJudgement const& each) { return type.IsKnown() && *type.fValue == each.fType; });
  return found == std::end(kOtherJudgements) ? kPartJudgement : *found;
}

// Critical entries with the same text.
struct TEvents {
  TElement fNewest;
  std::string fSource;
  std::uint64_t fAge;  // of the newest, in seconds
  std::size_t fCount;
};

// The text without the reading, which differs from entry to entry.
std::string EventOf(std::string const& text) { return text.substr(0, text.find("; reading ")); }

std::map<std::string, TEvents> CriticalEvents(TRuleRun& run) {
  constexpr std::uint64_t critical = 6;
  std::map<std::string, TEvents> byText;
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
  return byText;
}

void AskEvents(TRuleRun& run) {
  NoteUnread(run, "event log");
  for (TElement const& log : run.TryElements("ZEP_EventLog")) run.Know(log, log.Number("CurrentNumberOfRecords"));
  for (auto const& [text, events] : CriticalEvents(run)) {
    TJudgement const& judgement = JudgementOf(events.fNewest, text);
    std::string const often = events.fCount > 1 ? ", the last of " + std::to_string(events.fCount) : "";
    run.Add(events.fNewest, events.fSource, judgement.fSeverity,
            "the controller's event log has a critical entry: " + text + " (" + AgeText(events.fAge) + often + ")",
            std::string(judgement.fRemedy) + " Then clear the event log (ipmitool sel clear).");
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

// Whether the newest entry with a date is later than the clock. Older ones may be from before the clock was corrected.
bool IsNewestEntryLater(TRuleRun const& run) {
  bool isLater = false;
  for (TElement const& entry : run.TryElements("ZEP_EventLogEntry")) {
    auto const age = entry.Number("Age");
    bool const hasDate = age.IsKnown() || age.fMissing.fCode == kMissingUnexpected;
    if (hasDate) isLater = !age.IsKnown();
  }
  return isLater;
}

void AskClock(TRuleRun& run) {
  constexpr char const* firstYear = "2010";  // clocks that lost their time begin before it, such as in 2000
  constexpr char const* remedy = "Set it (ipmitool sel time set now), so that events in its log have dates.";
  NoteUnread(run, "event log");
  for (TElement const& log : OfController(run, "ZEP_EventLog")) {
    auto const clock = log.Text("ClockTime");
    auto const add = [&](std::string const& reason) { run.Add(log, clock.fSource, ESeverity::kWarning, reason, remedy); };
    if (!clock.IsKnown() && clock.fMissing.fCode == kMissingPlaceholder)
      add("the clock of the management controller is not set");
    else if (!run.Know(log, clock))
      continue;
    else if (clock.fValue->substr(0, 4) < firstYear)
      add("the clock of the management controller is in the year " + clock.fValue->substr(0, 4));
    else if (IsNewestEntryLater(run))
      add("the clock of the management controller is earlier than the newest entry of its event log");
  }
}

}  // namespace

std::vector<TRule> EventLogRules() {
  return {{"event-log-critical", "Does the controller's event log have a critical entry?", AskEvents},
          {"event-log-full", "Is the controller's event log full?", AskLogFull},
          {"controller-clock", "Is the clock of the management controller set?", AskClock}};
}

}  // namespace NQRVZEP20
