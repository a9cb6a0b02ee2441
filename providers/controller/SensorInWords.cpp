// SPDX-License-Identifier: Apache-2.0
#include "SensorInWords.h"

#include "EventWords.h"
#include "IpmiText.h"

#include <cmath>
#include <limits>

namespace NQRVZEP20 {

namespace {

constexpr std::uint16_t kUnknown = 0, kOther = 1, kOK = 2, kDegraded = 3, kStressed = 4, kError = 6;
constexpr std::uint16_t kPercentage = 65;
constexpr std::uint8_t kLastSharedUnit = 19;  // up to hertz, the schema has the units of IPMI in the same order

std::uint16_t SchemaTypeOf(std::uint8_t sensorType) {
  constexpr std::uint8_t temperature = 1, voltage = 2, current = 3, fan = 4, intrusion = 5;
  switch (sensorType) {
    case temperature:
      return 2;
    case voltage:
      return 3;
    case current:
      return 4;
    case fan:
      return 5;
    case intrusion:
      return 16;
    default:
      return kOther;
  }
}

std::uint16_t SchemaUnitOf(TSdrSensor const& sensor) {
  if (sensor.fIsPercentage) return kPercentage;
  if (sensor.fUnit == 0) return kUnknown;
  return sensor.fUnit <= kLastSharedUnit ? sensor.fUnit + 1 : kOther;
}

// The worst first.
constexpr struct {
  TRawThresholds::EPlace fPlace;
  char const* fName;
} kThresholdStates[] = {{TRawThresholds::kUpperFatal, "Upper Fatal"},
                        {TRawThresholds::kLowerFatal, "Lower Fatal"},
                        {TRawThresholds::kUpperCritical, "Upper Critical"},
                        {TRawThresholds::kLowerCritical, "Lower Critical"},
                        {TRawThresholds::kUpperNonCritical, "Upper Non-Critical"},
                        {TRawThresholds::kLowerNonCritical, "Lower Non-Critical"}};

std::string ThresholdState(std::uint16_t states) {
  for (auto const& state : kThresholdStates)
    if ((states >> state.fPlace & 1) != 0) return state.fName;
  return "Normal";
}

std::string StateNames(TSdrSensor const& sensor, std::uint16_t states) {
  std::string text;
  for (unsigned state = 0; state < 15; ++state)
    if ((states >> state & 1) != 0) text += (text.empty() ? "" : ", ") + StateName(sensor.fType, sensor.fReadingType, state);
  return text.empty() ? "none" : text;
}

std::uint16_t StatusFrom(EEventSeverity severity) {
  switch (severity) {
    case EEventSeverity::kInformation:
      return kOK;
    case EEventSeverity::kWarning:
      return kDegraded;
    case EEventSeverity::kCritical:
      return kError;
    default:
      return kUnknown;
  }
}

std::uint16_t StatusFrom(std::string const& state) {
  if (state == "Normal") return kOK;
  return state.find("Non-Critical") != std::string::npos ? kStressed : kError;
}

bool HasThresholds(TSdrSensor const& sensor) { return sensor.fReadingType == kThresholdReading; }

}  // namespace

TSensorNumbers NumbersOf(TSdrSensor const& sensor) {
  return {SchemaTypeOf(sensor.fType), SchemaUnitOf(sensor), sensor.fScale.IsWhole() ? 0 : -3};
}

TFinding<std::int32_t> ScaledValue(TSdrSensor const& sensor, std::uint8_t raw) {
  return ValueOf(sensor.fScale, raw).Then([&](double value) -> TFinding<std::int32_t> {
    double const scaled = std::round(value * (sensor.fScale.IsWhole() ? 1 : 1000));
    if (std::fabs(scaled) <= std::numeric_limits<std::int32_t>::max()) return static_cast<std::int32_t>(scaled);
    return TMissing{kMissingUnexpected, "the value has more digits than the property can have"};
  });
}

TFinding<std::int32_t> ScaledThreshold(TSensorState const& state, TRawThresholds::EPlace place) {
  if ((state.fThresholds.fValid >> place & 1) == 0) return TMissing{kMissingNotApplicable, "the sensor has no such threshold"};
  return ScaledValue(state.fSensor, state.fThresholds.fRaw[place]);
}

TFinding<std::string> StateTextOf(TSensorState const& state) {
  return state.fStates.Then([&](std::uint16_t states) {
    return HasThresholds(state.fSensor) ? ThresholdState(states) : StateNames(state.fSensor, states);
  });
}

TFinding<std::vector<std::uint16_t>> StatusOf(TSensorState const& state) {
  return state.fStates.Then([&](std::uint16_t states) {
    return std::vector<std::uint16_t>{HasThresholds(state.fSensor) ? StatusFrom(ThresholdState(states))
                                                                   : StatusFrom(SeverityOfStates(state.fSensor, states))};
  });
}

std::string LabelOf(TSdrSensor const& sensor) {
  return sensor.fName ? *sensor.fName : "sensor 0x" + HexText(std::string(1, static_cast<char>(sensor.fNumber)));
}

}  // namespace NQRVZEP20
