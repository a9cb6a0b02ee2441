// SPDX-License-Identifier: Apache-2.0
#include "collect/findings/AgeText.h"
#include "collect/findings/ControllerElements.h"
#include "collect/findings/Findings.h"
#include "collect/findings/Rules.h"

#include <algorithm>
#include <iterator>

namespace NQRVZEP20 {

namespace {

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

bool Contains(std::string const& text, char const* part) { return text.find(part) != std::string::npos; }

constexpr char const *kPresent = "Presence detected", *kInserted = "Device Inserted/Device Present";
constexpr char const* kAbsent = "Device Removed/Device Absent";

// Whether the bay of the sensor's part is empty. A power supply may also report this by the lack of a state.
bool IsAbsent(std::string const& type, std::string const& state, bool isError) {
  bool const isSupply = type == "Power Supply" && !isError;
  return state == kAbsent || (isSupply && !Contains(state, kPresent) && !Contains(state, kInserted));
}

bool IsRemoval(std::string const& text) {
  std::string const removals[] = {std::string(": ") + kPresent + ", deasserted", std::string(": ") + kInserted + ", deasserted",
                                  std::string(": ") + kAbsent + ", asserted"};
  return std::any_of(std::begin(removals), std::end(removals),
                     [&](std::string const& removal) { return Contains(text, removal.c_str()); });
}

// Whether the event log records that the part of the sensor was removed. A bay that was never used has no such entry. Sensors are
// compared by DeviceID, because some controllers give the same name to the sensors of all parts.
bool WasRemoved(TRuleRun& run, TElement const& sensor) {
  std::string const id = sensor.NameIn("DeviceID");
  auto const entries = run.TryElements("ZEP_EventLogEntry");
  return std::any_of(entries.begin(), entries.end(), [&](TElement const& entry) {
    auto const text = entry.Text("RecordData");
    auto const age = entry.Number("Age");
    if (!text.IsKnown() || !IsRemoval(*text.fValue) || entry.NameIn("SensorDeviceID") != id) return false;
    return run.Know(entry, age) && *age.fValue <= run.Thresholds().fEventLogDays * kSecondsOfADay;
  });
}

void JudgeState(TRuleRun& run, TElement const& sensor, std::string const& type, TAnswer<std::string> const& state, bool isError) {
  std::string const part = sensor.Label() + " (" + type + ")";
  if (IsAbsent(type, *state.fValue, isError)) {
    if (WasRemoved(run, sensor))
      run.Add(sensor, state.fSource, ESeverity::kError, part + " is missing: the controller's event log records its removal",
              "Insert it again. If it was removed on purpose, clear the event log (ipmitool sel clear).");
  } else if (isError) {
    run.Add(sensor, state.fSource, ESeverity::kError, "the controller reports a failure of " + part + ": " + *state.fValue,
            "Check the part and its connections, and replace it.");
  }
}

void AskStates(TRuleRun& run) {
  constexpr char const* error = "6";
  for (char const* const list : {"sensors", "event log"}) NoteUnread(run, list);
  for (TElement const& sensor : OfController(run, "CIM_Sensor")) {
    auto const type = sensor.Text("OtherSensorTypeDescription"), state = sensor.Text("CurrentState");
    auto const status = sensor.Texts("OperationalStatus");
    bool const hasNumber = sensor.Value("UnitModifier").IsKnown();  // judged by its thresholds
    if (hasNumber || !type.IsKnown() || !IsJudged(*type.fValue) || !run.Know(sensor, status) || !run.Know(sensor, state))
      continue;
    JudgeState(run, sensor, *type.fValue, state, !status.fValue->empty() && status.fValue->front() == error);
  }
}

bool IsOfSensors(TRule const& rule) { return rule.fId == "sensor-threshold" || rule.fId == "fan-stopped"; }

}  // namespace

std::vector<TRule> ManagementControllerRules() {
  std::vector<TRule> rules = {{"controller-part-failed", "Does the management controller report a failed part?", AskStates}};
  for (TRule& rule : EventLogRules()) rules.push_back(std::move(rule));
  rules.push_back({"controller-account", "Does the management controller have accounts that anyone might know?", AskAccounts});
  return rules;
}

std::vector<TRule> ControllerRules() {
  std::vector<TRule> rules;
  for (TRule& rule : SensorRules())
    if (IsOfSensors(rule)) rules.push_back(std::move(rule));
  for (TRule& rule : ManagementControllerRules()) rules.push_back(std::move(rule));
  return rules;
}

}  // namespace NQRVZEP20
