// SPDX-License-Identifier: Apache-2.0

// Reads a controller whose answers are any bytes: each answer is a byte with its length and as many bytes. After the last one,
// the controller is silent. Each property of each record must then have a value or a reason.

#include "fuzz/Require.h"
#include "providers/controller/ControllerRecords.h"

#include <string_view>

namespace NQRVZEP20 {
namespace {

// Answers from the bytes, which must outlive it.
TIpmi AnswersFrom(std::string_view bytes) {
  return [bytes](TIpmiRequest const&) mutable -> TFinding<std::string> {
    if (bytes.empty()) return TMissing{kMissingNoAnswer, "silence"};
    std::string answer(bytes.substr(1, static_cast<std::uint8_t>(bytes.front())));
    bytes.remove_prefix(1 + answer.size());
    return answer;
  };
}

TController Read(std::string_view bytes) {
  auto const noCache = [](std::string const&) { return nullptr; };
  auto const checkProgress = [](char const*, std::size_t done, std::size_t all) { Require(done <= all); };
  return ReadController(AnswersFrom(bytes), noCache, checkProgress);
}

void RequireWhole(TRecord const& record) {
  for (TRecordProperty const& property : record.GetProperties())
    Require(!property.fValue.IsNull() || (!property.fMissing.fCode.empty() && !property.fMissing.fReason.empty()));
}

void RequireWhole(TFruDevice const& device) {
  if (!device.fAreas) return RequireWhole(PackageRecord(device, UnreadArea(device.fAreas.Why())));
  for (TFruArea const& area : *device.fAreas) RequireWhole(PackageRecord(device, area));
}

void RequireWhole(TEventLog const& log) {
  RequireWhole(LogRecord(log));
  for (TSelEntry const& entry : log.fEntries) RequireWhole(EntryRecord({entry, nullptr, std::uint64_t{0}}));
}

void RequireWhole(TController const& controller) {
  static TComputerSystem const system(TMachineFiles("/nonexistent"));
  RequireWhole(ControllerRecord(controller, system));
  if (controller.fLans)
    for (TLanChannel const& lan : *controller.fLans) RequireWhole(NetworkRecord(lan));
  if (controller.fUsers)
    for (TUserAccount const& account : *controller.fUsers) RequireWhole(AccountRecord(account, system));
  for (TSensorState const& sensor : controller.fSensors) {
    RequireWhole(StateSensorRecord(sensor, system));
    RequireWhole(NumericSensorRecord(sensor, system));
  }
  for (TFruDevice const& device : controller.fFrus) RequireWhole(device);
  if (controller.fLog) RequireWhole(*controller.fLog);
}

}  // namespace
}  // namespace NQRVZEP20

extern "C" int LLVMFuzzerTestOneInput(std::uint8_t const* data, std::size_t size) {
  using namespace NQRVZEP20;
  RequireWhole(Read({reinterpret_cast<char const*>(data), size}));
  return 0;
}
