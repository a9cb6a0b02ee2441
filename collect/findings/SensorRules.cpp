// SPDX-License-Identifier: Apache-2.0
#include "collect/findings/ControllerElements.h"
#include "collect/findings/Rules.h"

#include <algorithm>

namespace NQRVZEP20 {

namespace {

constexpr char const *kTemperature = "2", *kTachometer = "5";  // values of SensorType

bool Is(TElement const& sensor, char const* type) {
  auto const value = sensor.Text("SensorType");
  return value.IsKnown() && *value.fValue == type;
}

bool Contains(std::string const& text, char const* part) { return text.find(part) != std::string::npos; }

// Boards often have wrong thresholds for voltages and currents below the critical ones, so only temperatures are judged by them.
void AskSensors(TRuleRun& run) {
  NoteUnread(run, "sensors");
  for (TElement const& sensor : run.Elements("CIM_NumericSensor")) {
    auto const state = sensor.Text("CurrentState");
    if (Is(sensor, kTachometer) || !run.Know(sensor, state)) continue;
    bool const isBeyond = Contains(*state.fValue, "Upper") || Contains(*state.fValue, "Lower");
    bool const isCritical = isBeyond && !Contains(*state.fValue, "Non-Critical");
    if (isCritical || (isBeyond && Is(sensor, kTemperature)))
      run.Add(sensor, state.fSource, isCritical ? ESeverity::kError : ESeverity::kWarning,
              "the sensor " + sensor.Label() + " is beyond a threshold (" + *state.fValue + ")",
              Is(sensor, kTemperature) ? "Check the fans, the air flow and the temperature of the room."
                                       : "Check the power supplies and the part that the sensor belongs to.");
  }
}

// Whether the sensor is the controller's. Its firmware lists the fans that the machine has; the chips of hwmon count the pulses
// at every header, with a lowest speed of their own.
bool IsOfController(TElement const& sensor) { return sensor.NameIn("DeviceID").rfind("ipmi ", 0) == 0; }

void JudgeFan(TRuleRun& run, TElement const& fan, TAnswer<std::string> const& state) {
  auto const reading = fan.Text("CurrentReading");
  bool const isSlow = Contains(*state.fValue, "Lower"), isCritical = isSlow && !Contains(*state.fValue, "Non-Critical");
  bool const stands = isSlow && reading.IsKnown() && *reading.fValue == "0";
  std::string const name = "the fan " + fan.Label();
  if (*state.fValue == "Fault" || (stands && (isCritical || IsOfController(fan))))
    run.Add(fan, state.fSource, ESeverity::kError, name + " has stopped or is broken", "Replace the fan.");
  else if (stands)
    run.Add(fan, state.fSource, ESeverity::kWarning, name + " does not turn, or is not connected",
            "If a fan is connected there, replace it; otherwise set its lowest speed to 0 (fan*_min in /sys/class/hwmon).");
  else if (isCritical)
    run.Add(fan, state.fSource, ESeverity::kError, name + " is too slow (" + *state.fValue + ")",
            "Clean the fan, or replace it.");
}

void AskFans(TRuleRun& run) {
  NoteUnread(run, "sensors");
  auto const sensors = run.Elements("CIM_NumericSensor");
  bool const hasFan = std::any_of(sensors.begin(), sensors.end(), [](TElement const& each) { return Is(each, kTachometer); });
  if (!sensors.empty() && !hasFan && run.GetNotAsked().empty()) run.NoteNotAsked({"no sensor measures the speed of a fan", ""});
  for (TElement const& sensor : sensors) {
    if (!Is(sensor, kTachometer)) continue;
    auto const state = sensor.Text("CurrentState");
    if (run.Know(sensor, state)) JudgeFan(run, sensor, state);
  }
}

// A supply without power is lost only if another one has power: a machine with a battery may do without.
void AskPowerSupplies(TRuleRun& run) {
  constexpr char const *ok = "2", *failed = "6", *stopped = "10";
  auto const statusOf = [](TElement const& supply) {
    auto const status = supply.Texts("OperationalStatus");
    return status.IsKnown() && !status.fValue->empty() ? status.fValue->front() : "";
  };
  auto const supplies = run.Elements("CIM_PowerSupply");
  bool const hasPower =
      std::any_of(supplies.begin(), supplies.end(), [&](TElement const& supply) { return statusOf(supply) == ok; });
  for (TElement const& supply : supplies) {
    auto const status = supply.Texts("OperationalStatus");
    if (!run.Know(supply, status)) continue;
    std::string const code = statusOf(supply);
    if (code == failed)
      run.Add(supply, status.fSource, ESeverity::kError, "the power supply " + supply.Label() + " has failed",
              "Replace the power supply.");
    else if (code == stopped && hasPower)
      run.Add(supply, status.fSource, ESeverity::kError, "the power supply " + supply.Label() + " has no power",
              "Check its cable and the circuit that it is connected to; if both work, replace the power supply.");
  }
}

// The errors that the memory controller could not assign to a module have no place.
std::string FaultyModule(TElement const& errors) {
  bool const isOfModule = !errors.Value("Location").IsNotApplicable();
  return isOfModule ? "the memory module" : "the faulty memory module (a memory test or the controller's event log may name it)";
}

void AskMemoryErrors(TRuleRun& run) {
  std::string const since = " since the start: ",
                    reset =
                        " The counters begin at 0 when 1 is written to reset_counters of the memory controller (below "
                        "/sys/devices/system/edac/mc), or when the machine is restarted.";
  for (TElement const& errors : run.Elements("ZEP_MemoryErrors")) {
    auto const corrected = errors.Number("CorrectedErrors"), uncorrected = errors.Number("UncorrectedErrors");
    std::string const place = "the memory " + errors.Label() + " has had ", module = FaultyModule(errors);
    if (run.Know(errors, uncorrected) && *uncorrected.fValue > 0)
      run.Add(errors, uncorrected.fSource, ESeverity::kCritical,
              place + "uncorrected errors" + since + std::to_string(*uncorrected.fValue), "Replace " + module + "." + reset);
    if (run.Know(errors, corrected) && *corrected.fValue > run.Thresholds().fCorrectedMemoryErrors)
      run.Add(errors, corrected.fSource, ESeverity::kWarning,
              place + "corrected errors" + since + std::to_string(*corrected.fValue),
              "Watch the number, and replace " + module + " if it grows." + reset);
  }
}

void AskPciErrors(TRuleRun& run) {
  constexpr char const* remedy =
      "Seat the card anew; if the number grows, replace the card or the riser. The counters begin at 0 when the device is "
      "removed "
      "and found again, or when the machine is restarted.";
  for (TElement const& errors : run.Elements("ZEP_PCIErrors")) {
    std::string const place = "the PCI Express device " + errors.Label() + " has had ";
    auto const report = [&](char const* property, char const* kind, ESeverity severity, std::uint64_t highest) {
      auto const count = errors.Number(property);
      if (run.Know(errors, count) && *count.fValue > highest)
        run.Add(errors, count.fSource, severity, place + kind + std::to_string(*count.fValue), remedy);
    };
    report("FatalErrors", "fatal errors since the start: ", ESeverity::kError, 0);
    report("NonFatalErrors", "uncorrected errors since the start: ", ESeverity::kWarning, 0);
    report("CorrectableErrors", "corrected errors since the start: ", ESeverity::kWarning, run.Thresholds().fCorrectedPciErrors);
  }
}

}  // namespace

std::vector<TRule> SensorRules() {
  return {{"sensor-threshold", "Is a sensor beyond its threshold?", AskSensors},
          {"fan-stopped", "Has a fan stopped?", AskFans},
          {"power-supply-lost", "Has a power supply failed or lost its power?", AskPowerSupplies},
          {"memory-errors", "Has the memory had errors?", AskMemoryErrors},
          {"pci-errors", "Has a PCI Express device had errors?", AskPciErrors}};
}

}  // namespace NQRVZEP20
