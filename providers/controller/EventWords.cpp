// SPDX-License-Identifier: Apache-2.0
#include "EventWords.h"

#include "IpmiText.h"

#include <freeipmi/freeipmi.h>

#include <array>
#include <cmath>
#include <cstdio>
#include <memory>

namespace NQRVZEP20 {

namespace {

constexpr std::uint8_t kSensorSpecific = 0x6F;

// The text that a function of libfreeipmi writes into a buffer; empty if it has none.
template <class TFunction>
std::string TextOf(TFunction const& write) {
  std::array<char, 512> buffer = {};
  return write(buffer.data(), static_cast<unsigned>(buffer.size() - 1)) > 0 ? buffer.data() : std::string();
}

// The states of nominal, warning and critical events are built into libfreeipmi; no file is read.
class TInterpreter {
public:
  TInterpreter() : fContext(::ipmi_interpret_ctx_create(), ::ipmi_interpret_ctx_destroy) {}
  explicit operator bool() const { return fContext != nullptr; }
  ipmi_interpret_ctx_t Get() const { return fContext.get(); }

private:
  std::unique_ptr<ipmi_interpret_ctx, decltype(&::ipmi_interpret_ctx_destroy)> fContext;
};

TInterpreter const& Interpreter() {
  static TInterpreter const interpreter;
  return interpreter;
}

EEventSeverity SeverityFrom(unsigned state) {
  switch (state) {
    case IPMI_INTERPRET_STATE_NOMINAL:
      return EEventSeverity::kInformation;
    case IPMI_INTERPRET_STATE_WARNING:
      return EEventSeverity::kWarning;
    case IPMI_INTERPRET_STATE_CRITICAL:
      return EEventSeverity::kCritical;
    default:
      return EEventSeverity::kUnknown;
  }
}

std::string NumberText(double value) {
  std::array<char, 64> buffer = {};
  std::snprintf(buffer.data(), buffer.size(), "%.6g", value);
  return buffer.data();
}

// "; reading 91, threshold 85 degrees C"
std::string ReadingText(TSelEntry const& entry, TSdrSensor const& sensor) {
  bool const hasReading = entry.fData[0] >> 6 == 1, hasThreshold = (entry.fData[0] >> 4 & 3) == 1;
  auto const reading = ValueOf(sensor.fScale, entry.fData[1]), threshold = ValueOf(sensor.fScale, entry.fData[2]);
  if (entry.fEventType != kThresholdReading || !hasReading || !reading) return "";
  std::string text = "; reading " + NumberText(*reading);
  if (hasThreshold && threshold) text += ", threshold " + NumberText(*threshold);
  std::string const unit = UnitText(sensor.fUnit);
  return unit.empty() ? text : text + " " + unit;
}

// The second and the third byte of an event of a defined type: "; Configuration Error", "; Memory module/device #4".
std::string DetailText(TSelEntry const& entry, unsigned state) {
  constexpr unsigned isDefined = 3;
  if (entry.fEventType != kSensorSpecific) return "";
  std::string second, third;
  if (entry.fData[0] >> 6 == isDefined)
    second = TextOf([&](char* buffer, unsigned size) {
      return ::ipmi_get_event_data2_message(entry.fSensorType, state, entry.fData[1], buffer, size);
    });
  if ((entry.fData[0] >> 4 & 3) == isDefined)
    third = TextOf([&](char* buffer, unsigned size) {
      return ::ipmi_get_event_data3_message(entry.fSensorType, state, entry.fData[1], entry.fData[2], buffer, size);
    });
  return (second.empty() ? "" : "; " + second) + (third.empty() ? "" : "; " + third);
}

}  // namespace

std::string SensorTypeName(std::uint8_t sensorType) {
  if (IPMI_SENSOR_TYPE_VALID(sensorType)) return ::ipmi_sensor_types[sensorType];
  return "sensor type 0x" + HexText(std::string(1, static_cast<char>(sensorType)));
}

std::string UnitText(TSensorUnit const& unit) {
  if (unit.fBase == 0 && !unit.fIsPercentage) return "";
  return TextOf([&](char* buffer, unsigned size) {
    return ::ipmi_sensor_units_string(unit.fIsPercentage ? 1 : 0, unit.fModifier, unit.fRate, unit.fBase, unit.fSecond, buffer,
                                      size, 0);
  });
}

std::string MakerName(std::uint32_t manufacturerId) {
  return TextOf([&](char* buffer, unsigned size) { return ::ipmi_iana_enterprise_numbers_string(manufacturerId, buffer, size); });
}

std::string StateName(std::uint8_t sensorType, std::uint8_t readingType, unsigned state) {
  std::string const text = TextOf([&](char* buffer, unsigned size) {
    return readingType == kSensorSpecific ? ::ipmi_get_sensor_type_message(sensorType, state, buffer, size)
                                          : ::ipmi_get_generic_event_message(readingType, state, buffer, size);
  });
  return text.empty() ? "state " + std::to_string(state) : text;
}

std::string EventText(TSelEntry const& entry, TSdrSensor const* sensor) {
  if (entry.fKind != TSelEntry::EKind::kEvent) return "entry in a form of the maker: " + HexText(entry.fBytes, " ");
  unsigned const state = entry.fData[0] & 0x0F;
  std::string const text =
      StateName(entry.fSensorType, entry.fEventType, state) + (entry.fIsDeasserted ? ", deasserted" : ", asserted");
  return text + DetailText(entry, state) + (sensor != nullptr ? ReadingText(entry, *sensor) : "");
}

EEventSeverity SeverityOf(TSelEntry const& entry) {
  if (entry.fKind != TSelEntry::EKind::kEvent || !Interpreter()) return EEventSeverity::kUnknown;
  if (entry.fIsDeasserted) return EEventSeverity::kInformation;
  unsigned state = IPMI_INTERPRET_STATE_UNKNOWN;
  bool const isKnown =
      ::ipmi_interpret_sel(Interpreter().Get(), entry.fBytes.data(), static_cast<unsigned>(entry.fBytes.size()), &state) == 0;
  return isKnown ? SeverityFrom(state) : EEventSeverity::kUnknown;
}

EEventSeverity SeverityOfStates(TSdrSensor const& sensor, std::uint16_t states) {
  unsigned state = IPMI_INTERPRET_STATE_UNKNOWN;
  bool const isKnown =
      Interpreter() && ::ipmi_interpret_sensor(Interpreter().Get(), sensor.fReadingType, sensor.fType, states, &state) == 0;
  return isKnown ? SeverityFrom(state) : EEventSeverity::kUnknown;
}

TFinding<double> ValueOf(TSensorScale const& scale, std::uint8_t raw) {
  if (!scale.HasNumber()) return TMissing{kMissingNotApplicable, "the sensor has states, and no number"};
  double value = 0;
  bool const isValue = ::ipmi_sensor_decode_value(scale.fResultExponent, scale.fBExponent, scale.fM, scale.fB,
                                                  scale.fLinearization, scale.fForm, raw, &value) == 0;
  if (isValue && std::isfinite(value)) return value;
  return TMissing{kMissingUnexpected, "the sensor's record has no formula that libfreeipmi can calculate"};
}

}  // namespace NQRVZEP20
