// SPDX-License-Identifier: Apache-2.0

// Reads any bytes as a record of the repository of sensor data, and converts each raw reading of the sensor.

#include "fuzz/Require.h"
#include "providers/controller/EventWords.h"
#include "providers/controller/SdrRecord.h"

#include <cmath>

extern "C" int LLVMFuzzerTestOneInput(std::uint8_t const* data, std::size_t size) {
  using namespace NQRVZEP20;
  TSdrRecord const record = SdrRecordFrom({reinterpret_cast<char const*>(data), size});
  Require(!record.fSensor || !record.fFru);
  if (!record.fSensor) return 0;
  auto const sharers = SharersOf(*record.fSensor);
  Require(sharers.size() <= 15);
  for (std::size_t i = 0; i < sharers.size(); ++i) Require(sharers[i].fNumber == record.fSensor->fNumber + i);
  for (unsigned raw = 0; raw < 256; ++raw) {
    auto const value = ValueOf(record.fSensor->fScale, static_cast<std::uint8_t>(raw));
    Require(value ? std::isfinite(*value) : !value.Why().fReason.empty());
  }
  for (unsigned state = 0; state < 16; ++state)
    Require(!StateName(record.fSensor->fType, record.fSensor->fReadingType, state).empty());
  Require(!SensorTypeName(record.fSensor->fType).empty());
  UnitText(record.fSensor->fUnit);
  SeverityOfStates(*record.fSensor, 0x7FFF);
  return 0;
}
