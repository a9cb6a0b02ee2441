// SPDX-License-Identifier: Apache-2.0
#include "TController.h"

#include "ControllerParts.h"
#include "TBytes.h"

#include <algorithm>

namespace NQRVZEP20 {

namespace {

constexpr std::uint8_t kGetDeviceId = 0x01, kGetGuid = 0x37;

std::vector<TSdrRecord> ParsedRecords(std::vector<std::string> const& records) {
  std::vector<TSdrRecord> parsed;
  std::transform(records.begin(), records.end(), std::back_inserter(parsed), SdrRecordFrom);
  return parsed;
}

void ReadSensors(TController& controller, TIpmi const& ipmi, std::vector<TSdrRecord> const& records, TProgress const& progress) {
  std::size_t done = 0;
  for (TSdrRecord const& record : records) {
    ++done;
    if (!record.fSensor) continue;
    for (TSdrSensor const& sensor : SharersOf(*record.fSensor))
      if (sensor.fKind == TSdrSensor::EKind::kEventOnly)
        controller.fEventSensors.push_back(sensor);
      else
        controller.fSensors.push_back(ReadSensor(ipmi, sensor));
    if (record.fSensor->fKind != TSdrSensor::EKind::kEventOnly) progress("sensors", done, records.size());
  }
}

TFinding<std::vector<TFruArea>> AreasOf(TFruLocator const& fru, TIpmi const& ipmi) {
  if (fru.fController != kThisController || fru.fLun != 0)
    return TMissing{kMissingNotGiven, "the FRU device belongs to another controller or another LUN, which is not queried"};
  if (!fru.fIsLogical) return TMissing{kMissingNotGiven, "the FRU device is on a bus of the controller, which is not read"};
  return ReadFru(ipmi, fru.fDevice);
}

// Device 0 is the controller's own, and needs no record.
void ReadFrus(TController& controller, TIpmi const& ipmi, std::vector<TSdrRecord> const& records) {
  controller.fFrus.push_back({kThisController, 0, "FRU 0", ReadFru(ipmi, 0)});
  for (TSdrRecord const& record : records) {
    if (!record.fFru) continue;
    TFruLocator const& fru = *record.fFru;
    if (fru.fController == kThisController && fru.fIsLogical && fru.fDevice == 0) continue;
    std::string const name = fru.fName ? *fru.fName : "FRU " + std::to_string(fru.fDevice);
    controller.fFrus.push_back({fru.fController, fru.fDevice, name, AreasOf(fru, ipmi)});
  }
}

}  // namespace

TFinding<TDeviceId> DeviceIdFrom(std::string const& answer) {
  if (answer.size() < 11) return TMissing{kMissingUnexpected, "the answer to Get Device ID is too short"};
  TBytes const bytes(answer);
  auto const bcd = [](unsigned byte) { return std::to_string(byte >> 4) + std::to_string(byte & 0x0F); };
  TDeviceId id;
  id.fNumber = bytes.At(0);
  id.fRevision = bytes.At(1) & 0x0F;
  id.fFirmware = std::to_string(bytes.At(2) & 0x7F) + "." + bcd(bytes.At(3));
  id.fIpmiVersion = std::to_string(bytes.At(4) & 0x0F) + "." + std::to_string(bytes.At(4) >> 4);
  id.fManufacturer = bytes.Long(6) & 0x0FFFFF;
  id.fProduct = bytes.Word(9);
  return id;
}

TController ReadController(TIpmi const& ipmi, TMakeCache const& makeCache, TProgress const& progress) {
  TController controller;
  auto const id = Ask(ipmi, {kApplication, kGetDeviceId});
  controller.fDeviceId = id.Then(DeviceIdFrom);
  controller.fGuid = Ask(ipmi, {kApplication, kGetGuid}, 16).Then(GuidFrom);
  controller.fLans = ReadLanChannels(ipmi);
  controller.fUsers = ReadUsers(ipmi, controller.fLans);

  std::string const identity = (id ? *id : "") + (controller.fGuid ? *controller.fGuid : "");
  auto const cache = makeCache(identity);
  auto const repository = ReadSdrRepository(ipmi, cache.get(), progress);
  controller.fHasAllRecords = repository.Then([](TSdrRepository const& read) { return read.fIsComplete; });
  auto const records = repository ? ParsedRecords(repository->fRecords) : std::vector<TSdrRecord>();
  ReadSensors(controller, ipmi, records, progress);
  controller.fLog = ReadEventLog(ipmi, progress);
  ReadFrus(controller, ipmi, records);
  return controller;
}

}  // namespace NQRVZEP20
