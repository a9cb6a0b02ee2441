// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "EventLog.h"
#include "FruAreas.h"
#include "Ipmi.h"
#include "SdrRepository.h"

#include <cstdint>
#include <functional>
#include <memory>
#include <string>
#include <vector>

namespace NQRVZEP20 {

// The answer to Get Device ID.
struct TDeviceId {
  std::uint8_t fNumber = 0, fRevision = 0;
  std::string fFirmware, fIpmiVersion;  // "1.10", "2.0"
  std::uint32_t fManufacturer = 0;
  std::uint16_t fProduct = 0;
};
TFinding<TDeviceId> DeviceIdFrom(std::string const& answer);

// A LAN channel of the controller. Addresses are texts, as people write them.
struct TLanChannel {
  std::uint8_t fNumber = 0;
  TFinding<std::string> fAddress = TMissing{}, fSource = TMissing{}, fMask = TMissing{}, fMac = TMissing{}, fGateway = TMissing{};
  TFinding<std::uint16_t> fVlan = TMissing{};
};

// An account of the controller, as it applies to one channel.
struct TUserAccount {
  std::uint8_t fNumber = 0, fChannel = 0;
  TFinding<std::string> fName = TMissing{};  // missing for the account without a name
  TFinding<bool> fIsEnabled = TMissing{};
  std::string fPrivilege;  // the highest that it may have: "Administrator"
  bool fHasLanAccess = false;
};

// A sensor with what it reports now.
struct TSensorState {
  TSdrSensor fSensor;
  TFinding<std::uint8_t> fRaw = TMissing{};      // of a sensor with a number
  TFinding<std::uint16_t> fStates = TMissing{};  // a bit for each state; of a threshold sensor, TRawThresholds::EPlace
  TRawThresholds fThresholds;
};

// A FRU device.
struct TFruDevice {
  std::uint8_t fController = 0x20, fNumber = 0;
  std::string fName;
  TFinding<std::vector<TFruArea>> fAreas = TMissing{};
};

// Everything that is read from a controller. Each part is missing for a reason of its own.
struct TController {
  TFinding<TDeviceId> fDeviceId = TMissing{};
  TFinding<std::string> fGuid = TMissing{};
  TFinding<std::vector<TLanChannel>> fLans = TMissing{};
  TFinding<std::vector<TUserAccount>> fUsers = TMissing{};
  TFinding<bool> fHasAllRecords = TMissing{};  // of sensor data; otherwise why some or all are missing
  std::vector<TSensorState> fSensors;
  std::vector<TSdrSensor> fEventSensors;  // without a reading; only the event log names them
  std::vector<TFruDevice> fFrus;
  TFinding<TEventLog> fLog = TMissing{};
};

// Makes the cache for the controller with this identity; the result may be null.
using TMakeCache = std::function<std::unique_ptr<ISdrCache>(std::string const& identity)>;

// Reads the parts in an order that leaves the slow ones to the end: when the connection fails or the time is up, the parts that
// were read by then are there.
TController ReadController(TIpmi const& ipmi, TMakeCache const& makeCache, TProgress const& progress);

}  // namespace NQRVZEP20
