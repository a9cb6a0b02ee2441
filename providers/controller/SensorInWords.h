// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "TController.h"

namespace NQRVZEP20 {

// A sensor of a controller as the DMTF schema describes sensors.

struct TSensorNumbers {
  std::uint16_t fSensorType, fBaseUnits;
  std::int32_t fUnitModifier;  // readings are in this power of ten of the unit
  TFinding<std::uint16_t> fRateUnits;
};
TSensorNumbers NumbersOf(TSdrSensor const& sensor);

// The name of a unit that the schema lacks: "unit: packets per s".
TFinding<std::string> UnitDescriptionOf(TSdrSensor const& sensor);

// A raw value in that power of ten of the unit.
TFinding<std::int32_t> ScaledValue(TSdrSensor const& sensor, std::uint8_t raw);
TFinding<std::int32_t> ScaledThreshold(TSensorState const& state, TRawThresholds::EPlace place);

// "Normal", "Upper Critical", …; the states of a sensor without thresholds are joined by commas, "none" if there is none.
TFinding<std::string> StateTextOf(TSensorState const& state);

// The property OperationalStatus.
TFinding<std::vector<std::uint16_t>> StatusOf(TSensorState const& state);

// Its name, or "sensor 0x30".
std::string LabelOf(TSdrSensor const& sensor);

}  // namespace NQRVZEP20
