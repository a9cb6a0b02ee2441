// SPDX-License-Identifier: Apache-2.0
#include "collect/findings/AgeText.h"
#include "collect/findings/Findings.h"
#include "collect/findings/Rules.h"

#include <algorithm>
#include <iterator>
#include <map>

namespace NQRVZEP20 {

namespace {

// The elements of a class that belong to the management controller. Without a controller, notes why the rule could not be asked,
// in the same words for every class.
std::vector<TElement> OfController(TRuleRun& run, char const* className) {
  if (run.Elements("ZEP_ManagementController").empty()) return {};
  return run.Elements(className);
}

// Critical entries with the same text.
struct TEvents {
  TElement fNewest;
  std::string fSource;
  std::uint64_t fAge;  // of the newest, in seconds
  std::size_t fCount;
};

// The text without the reading, which differs from entry to entry.
std::string EventOf(std::string const& text) { return text.substr(0, text.find(';')); }

void AskEvents(TRuleRun& run) {
  constexpr std::uint64_t critical = 6;
  std::map<std::string, TEvents> byText;
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

// Names that makers give to the first account of every server.
bool IsNameOfMaker(std::string const& name) {
  constexpr char const* names[] = {"ADMIN", "Administrator", "USERID", "admin", "root"};
  return std::find(std::begin(names), std::end(names), name) != std::end(names);
}

void AskAccounts(TRuleRun& run) {
  constexpr std::uint64_t enabled = 2;
  for (TElement const& account : OfController(run, "ZEP_ControllerAccount")) {
    auto const state = account.Number("EnabledState");
    auto const hasAccess = account.Flag("HasLANAccess");
    auto const privilege = account.Text("Privilege"), name = account.Text("UserID");
    if (!run.Know(account, state) || *state.fValue != enabled) continue;
    if (!hasAccess.IsKnown() || !*hasAccess.fValue || !privilege.IsKnown() || *privilege.fValue == "No Access") continue;
    if (!name.IsKnown() && name.fMissing.fCode != kMissingNotGiven)
      run.Know(account, name);
    else if (!name.IsKnown())
      run.Add(account, state.fSource, ESeverity::kWarning,
              "the management controller has an enabled account without a name (" + *privilege.fValue + ")",
              "Disable it (ipmitool user disable " + account.Label() + "): its password alone is enough to log in.");
    else if (IsNameOfMaker(*name.fValue) && *privilege.fValue == "Administrator")
      run.Add(account, name.fSource, ESeverity::kInformation,
              "the management controller has an account with a maker's usual name: " + *name.fValue,
              "Change its password if it is still the one that the maker chose (ipmitool user set password " + account.Label() +
                  "): such passwords are published.");
  }
}

// Other sensors have states that are normal on many machines, such as an empty slot.
bool IsJudged(std::string const& sensorType) {
  constexpr char const* types[] = {"Fan", "Power Supply", "Memory", "Drive Slot", "Battery"};
  return std::any_of(std::begin(types), std::end(types), [&](char const* type) { return sensorType.rfind(type, 0) == 0; });
}

// Whether the event log records that the part was removed. A bay that was never used has no such entry.
bool WasRemoved(TRuleRun const& run, std::string const& part) {
  std::string const removal = part + ": Presence detected, deasserted";
  auto const entries = run.TryElements("ZEP_EventLogEntry");
  return std::any_of(entries.begin(), entries.end(), [&](TElement const& entry) {
    auto const text = entry.Text("RecordData");
    return text.IsKnown() && text.fValue->rfind(removal, 0) == 0;
  });
}

bool IsMissingSupply(TRuleRun const& run, TElement const& sensor, std::string const& type, std::string const& state) {
  return type == "Power Supply" && state.find("Presence detected") == std::string::npos && WasRemoved(run, sensor.Label());
}

void AskStates(TRuleRun& run) {
  constexpr char const* error = "6";
  for (TElement const& sensor : OfController(run, "CIM_Sensor")) {
    auto const type = sensor.Text("OtherSensorTypeDescription"), state = sensor.Text("CurrentState");
    auto const status = sensor.Texts("OperationalStatus");
    bool const hasNumber = sensor.Value("UnitModifier").IsKnown();  // judged by its thresholds
    if (hasNumber || !type.IsKnown() || !IsJudged(*type.fValue) || !run.Know(sensor, status) || !run.Know(sensor, state))
      continue;
    if (!status.fValue->empty() && status.fValue->front() == error)
      run.Add(sensor, state.fSource, ESeverity::kError,
              "the controller reports a failure of " + sensor.Label() + " (" + *type.fValue + "): " + *state.fValue,
              "Check the part and its connections, and replace it.");
    else if (IsMissingSupply(run, sensor, *type.fValue, *state.fValue))
      run.Add(sensor, state.fSource, ESeverity::kError,
              "the power supply " + sensor.Label() + " is missing: the controller's event log records its removal",
              "Insert it again. If it was removed on purpose, clear the event log (ipmitool sel clear).");
  }
}

bool IsOfSensors(TRule const& rule) { return rule.fId == "sensor-threshold" || rule.fId == "fan-stopped"; }

}  // namespace

std::vector<TRule> ManagementControllerRules() {
  return {{"controller-part-failed", "Does the management controller report a failed part?", AskStates},
          {"event-log-critical", "Does the controller's event log have a critical entry?", AskEvents},
          {"event-log-full", "Is the controller's event log full?", AskLogFull},
          {"controller-clock", "Is the clock of the management controller set?", AskClock},
          {"controller-account", "Does the management controller have accounts that anyone might know?", AskAccounts}};
}

std::vector<TRule> ControllerRules() {
  std::vector<TRule> rules;
  for (TRule& rule : SensorRules())
    if (IsOfSensors(rule)) rules.push_back(std::move(rule));
  for (TRule& rule : ManagementControllerRules()) rules.push_back(std::move(rule));
  return rules;
}

}  // namespace NQRVZEP20
