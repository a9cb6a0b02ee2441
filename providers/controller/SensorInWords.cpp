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

// The units of IPMI that the schema has, in the same order within each range.
constexpr struct TUnits {
  std::uint8_t fFirst, fLast;
  std::uint16_t fSchemaUnit;  // of the first
  std::int8_t fExponent;      // power of ten: the schema has no milliseconds
} kUnits[] = {{1, 19, 2, 0},    {20, 20, 21, -6}, {21, 21, 21, -3}, {22, 31, 21, 0}, {32, 32, 31, -3},
              {33, 33, 31, -2}, {34, 50, 31, 0},  {51, 51, 47, -3}, {52, 52, 48, 0}, {53, 53, 48, -6},
              {54, 58, 49, 0},  {60, 66, 54, 0},  {70, 70, 61, 0},  {74, 76, 62, 0}};

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

struct TSchemaUnit {
  std::uint16_t fUnit;
  std::int32_t fExponent;
};

// The schema has no units that are made of two.
TSchemaUnit SchemaUnitOf(TSensorUnit const& unit) {
  if (unit.fIsPercentage) return {kPercentage, 0};
  if (unit.fBase == 0) return {kUnknown, 0};
  for (TUnits const& units : kUnits)
    if (unit.fModifier == TSensorUnit::kNone && unit.fBase >= units.fFirst && unit.fBase <= units.fLast)
      return {static_cast<std::uint16_t>(units.fSchemaUnit + unit.fBase - units.fFirst), units.fExponent};
  return {kOther, 0};
}

// The schema has the rates of IPMI with the same numbers.
TFinding<std::uint16_t> RateOf(TSensorUnit const& unit) {
  constexpr std::uint8_t perDay = 6;
  if (unit.fRate <= perDay) return std::uint16_t{unit.fRate};
  return TMissing{kMissingUnexpected, "the sensor's record has the undefined rate " + std::to_string(unit.fRate)};
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
  auto const [unit, exponent] = SchemaUnitOf(sensor.fUnit);
  return {SchemaTypeOf(sensor.fType), unit, exponent + (sensor.fScale.IsWhole() ? 0 : -3), RateOf(sensor.fUnit)};
}

TFinding<std::string> UnitDescriptionOf(TSdrSensor const& sensor) {
  if (NumbersOf(sensor).fBaseUnits != kOther)
    return TMissing{kMissingNotApplicable, "BaseUnits has the unit if the controller has one"};
  std::string const text = UnitText(sensor.fUnit);
  if (text.empty()) return TMissing{kMissingUnexpected, "the sensor's record has a unit that is not defined"};
  return "unit: " + text;
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
