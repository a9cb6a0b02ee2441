// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "TController.h"
#include "providers/reasons/TComputerSystem.h"
#include "providers/reasons/TRecord.h"

namespace NQRVZEP20 {

// Records of the classes of this provider.
TRecord ControllerRecord(TController const& controller, TComputerSystem const& system);
TRecord NetworkRecord(TLanChannel const& lan);
TRecord AccountRecord(TUserAccount const& account, TComputerSystem const& system);
TRecord StateSensorRecord(TSensorState const& state, TComputerSystem const& system);    // CIM_Sensor
TRecord NumericSensorRecord(TSensorState const& state, TComputerSystem const& system);  // CIM_NumericSensor
TRecord PackageRecord(TFruDevice const& device, TFruArea const& area);
TRecord LogRecord(TEventLog const& log);

// `sensor`: the one that the entry is about; null if the repository does not have it.
struct TLoggedEvent {
  TSelEntry fEntry;
  TSdrSensor const* fSensor = nullptr;
  TFinding<std::uint64_t> fAge = TMissing{};  // in seconds
  bool fHasEnded = false;
};
TRecord EntryRecord(TLoggedEvent const& event);

}  // namespace NQRVZEP20
