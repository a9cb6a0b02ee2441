// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "SdrRecord.h"
#include "SelEntry.h"

#include <cstdint>
#include <string>
#include <vector>

namespace NQRVZEP20 {

// The words of the IPMI specification for numbers, from the tables of libfreeipmi.

// The severities of the property PerceivedSeverity.
enum class EEventSeverity : std::uint16_t { kUnknown = 0, kInformation = 2, kWarning = 3, kCritical = 6 };

// "Temperature"; "OEM Reserved" or "sensor type 0xd0" for types without a name.
std::string SensorTypeName(std::uint8_t sensorType);

// "degrees C", "packets per s", "%"; empty if there is none, or the tables lack it.
std::string UnitText(TSensorUnit const& unit);

// The name of the maker; empty if it is unknown.
std::string MakerName(std::uint32_t manufacturerId);

// The words for one state of a sensor: "Upper Critical - going high"; "state 3" if the tables have none.
std::string StateName(std::uint8_t sensorType, std::uint8_t readingType, unsigned state);

// The event in words, without its sensor: "Upper Critical - going high, asserted", with the reading and the threshold that the
// event has, converted by `sensor` if it is not null.
std::string EventText(TSelEntry const& entry, TSdrSensor const* sensor);

// Of the event, by libfreeipmi's table; the end of a state is an information.
EEventSeverity SeverityOf(TSelEntry const& entry);

// Of the states that a discrete sensor has now.
EEventSeverity SeverityOfStates(TSdrSensor const& sensor, std::uint16_t states);

// A raw value in the unit of the sensor. Missing if the sensor has no number.
TFinding<double> ValueOf(TSensorScale const& scale, std::uint8_t raw);

}  // namespace NQRVZEP20
