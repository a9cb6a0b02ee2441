// SPDX-License-Identifier: Apache-2.0
#include "ControllerNamespace.h"

#include "ControllerRecords.h"
#include "TMemoryNamespace.h"
#include "providers/reasons/TRecordWriter.h"

#include <algorithm>
#include <iterator>
#include <set>
#include <tuple>

namespace NQRVZEP20 {

namespace {

using TRecords = std::vector<TRecord>;

TMissing WhyNone(TFinding<bool> const& isComplete, char const* reason) {
  return isComplete ? TMissing{kMissingNotGiven, reason} : isComplete.Why();
}

template <class TElements>
TMissing WhyNone(TFinding<TElements> const& elements, char const* reason) {
  return elements ? TMissing{kMissingNotGiven, reason} : elements.Why();
}

template <class TElement, class TMakeRecord>
void WriteAll(TRecordWriter& writer, TFinding<std::vector<TElement>> const& elements, TMakeRecord const& makeRecord,
              char const* whyNone) {
  TRecords records;
  if (elements)
    for (TElement const& element : *elements) records.push_back(makeRecord(element));
  writer.Write(makeRecord(TElement()), records, WhyNone(elements, whyNone));
}

// A sensor that several records describe has one instance.
void WriteSensors(TRecordWriter& writer, TController const& controller, TComputerSystem const& system) {
  std::set<std::tuple<int, int, int>> seen;
  TRecords withStates, withNumbers;
  for (TSensorState const& state : controller.fSensors) {
    if (!seen.insert({state.fSensor.fOwner, state.fSensor.fLun, state.fSensor.fNumber}).second) continue;
    if (state.fSensor.fScale.HasNumber())
      withNumbers.push_back(NumericSensorRecord(state, system));
    else
      withStates.push_back(StateSensorRecord(state, system));
  }
  TSensorState const shape{};
  TMissing const whyNone = WhyNone(controller.fHasAllRecords, "the controller has no such sensors");
  writer.Write(StateSensorRecord(shape, system), withStates, whyNone);
  writer.Write(NumericSensorRecord(shape, system), withNumbers, whyNone);
  for (TRecords const* const records : {&withStates, &withNumbers})
    for (TRecord const& record : *records) writer.Associate(kSystemDevice, system.Record(), record);
}

// A device that was not read has an instance with the reasons, unless it is the only one.
void WritePackages(TRecordWriter& writer, TController const& controller) {
  auto const& devices = controller.fFrus;
  std::set<std::pair<int, int>> seen;
  TRecords records;
  TMissing whyNone{kMissingNotGiven, "the controller has no FRU data"};
  for (TFruDevice const& device : devices) {
    if (!seen.insert({device.fController, device.fNumber}).second) continue;
    if (!device.fAreas && devices.size() == 1)
      whyNone = device.fAreas.Why();
    else if (!device.fAreas)
      records.push_back(PackageRecord(device, UnreadArea(device.fAreas.Why())));
    else
      for (TFruArea const& area : *device.fAreas) records.push_back(PackageRecord(device, area));
  }
  writer.Write(PackageRecord({}, {}), records, whyNone);
}

// Common to an event and the later end of its state.
auto StateOf(TSelEntry const& entry) {
  return std::make_tuple(entry.fOwner, entry.fLun, entry.fSensorType, entry.fSensorNumber, entry.fEventType,
                         entry.fData[0] & 0x0F);
}

bool IsOf(TSelEntry const& entry, TSdrSensor const& sensor) {
  return entry.fKind == TSelEntry::EKind::kEvent && sensor.fOwner == entry.fOwner && sensor.fLun == entry.fLun &&
         sensor.fNumber == entry.fSensorNumber;
}

TSdrSensor const* SensorOf(TSelEntry const& entry, TController const& controller) {
  for (TSensorState const& state : controller.fSensors)
    if (IsOf(entry, state.fSensor)) return &state.fSensor;
  for (TSdrSensor const& sensor : controller.fEventSensors)
    if (IsOf(entry, sensor)) return &sensor;
  return nullptr;
}

// Whether a state bit of such a sensor is set as long as its state lasts. Those of other types, such as memory and interrupts,
// may be cleared when they were read.
bool HasLastingStates(std::uint8_t sensorType) {
  constexpr std::uint8_t types[] = {0x01, 0x02, 0x03, 0x04,        // temperature, voltage, current, fan
                                    0x05,                          // physical security
                                    0x08, 0x09, 0x0A, 0x0D,        // power supply, power unit, cooling device, drive slot
                                    0x15, 0x17, 0x1B, 0x21, 0x25,  // board, card, cable, slot, presence of a part
                                    0x29};                         // battery
  return std::find(std::begin(types), std::end(types), sensorType) != std::end(types);
}

// Whether the sensor can report the state of the event, and is not in it now.
bool IsOutOfState(TSensorState const& sensor, TSelEntry const& entry) {
  if (!sensor.fStates || sensor.fSensor.fReadingType != entry.fEventType) return false;
  unsigned const state = entry.fData[0] & 0x0FU;
  auto const isSet = [](std::uint16_t bits, unsigned place) { return (bits >> place & 1) != 0; };
  if (entry.fEventType == kThresholdReading)
    return !isSet(*sensor.fStates, state / 2);  // TRawThresholds::EPlace; each has an event for either direction
  return HasLastingStates(entry.fSensorType) && isSet(sensor.fSensor.fReadableStates, state) && !isSet(*sensor.fStates, state);
}

// Many controllers do not log the end of a state, or log it as another state: "Redundancy Lost", then "Fully Redundant".
bool IsOver(TSelEntry const& entry, TController const& controller) {
  return std::any_of(controller.fSensors.begin(), controller.fSensors.end(),
                     [&](TSensorState const& sensor) { return IsOf(entry, sensor.fSensor) && IsOutOfState(sensor, entry); });
}

constexpr std::uint64_t kLongestReading = 600;  // seconds; the clock is read before the entries, which may be added meanwhile

TFinding<std::uint64_t> AgeOf(TSelEntry const& entry, TFinding<std::uint64_t> const& clock) {
  TSelTime const time = SelTimeFrom(entry.fTime);
  if (time.fKind == TSelTime::EKind::kUnknown) return TMissing{kMissingNotGiven, "the entry has no time"};
  if (time.fKind != TSelTime::EKind::kDate)
    return TMissing{kMissingNotGiven, "the entry has no date: the clock of the controller was not set"};
  return clock.Then([&](std::uint64_t now) -> TFinding<std::uint64_t> {
    if (now >= time.fSeconds) return now - time.fSeconds;
    if (time.fSeconds - now <= kLongestReading) return std::uint64_t{0};
    return TMissing{kMissingUnexpected, "the entry is later than the clock of the controller"};
  });
}

// From the newest to the oldest, so that the ends of states come first.
std::vector<TLoggedEvent> EventsOf(TEventLog const& log, TController const& controller) {
  std::vector<TLoggedEvent> events;
  std::set<decltype(StateOf(TSelEntry()))> ended;
  std::set<std::uint16_t> seen;
  std::for_each(log.fEntries.rbegin(), log.fEntries.rend(), [&](TSelEntry const& entry) {
    bool const isEvent = entry.fKind == TSelEntry::EKind::kEvent;
    if (isEvent && entry.fIsDeasserted) ended.insert(StateOf(entry));
    bool const hasEnded = isEvent && (ended.count(StateOf(entry)) > 0 || IsOver(entry, controller));
    if (seen.insert(entry.fId).second) events.push_back({entry, SensorOf(entry, controller), AgeOf(entry, log.fClock), hasEnded});
  });
  std::reverse(events.begin(), events.end());
  return events;
}

void WriteLog(TRecordWriter& writer, TController const& controller) {
  auto const& log = controller.fLog;
  TRecords logs, entries;
  if (log) {
    logs.push_back(LogRecord(*log));
    for (TLoggedEvent const& event : EventsOf(*log, controller)) entries.push_back(EntryRecord(event));
  }
  TFinding<bool> const isComplete = log.Then([](TEventLog const& known) { return known.fIsComplete; });
  writer.Write(LogRecord({}), logs, WhyNone(log, ""));
  writer.Write(EntryRecord({}), entries, WhyNone(isComplete, "the event log is empty"));
}

}  // namespace

void FillControllerNamespace(TController const& controller, TMachineFiles const& files, TMemoryNamespace& ns) {
  TComputerSystem const system(files);
  TRecordWriter writer(ns);
  writer.Write(system.Record());
  TRecord const device = ControllerRecord(controller, system);
  TRecords devices;
  if (controller.fDeviceId) devices.push_back(device);
  writer.Write(device, devices, WhyNone(controller.fDeviceId, ""));
  if (controller.fDeviceId) writer.Associate(kSystemDevice, system.Record(), device);

  WriteAll(writer, controller.fLans, NetworkRecord, "the controller has no LAN channel");
  WriteAll(
      writer, controller.fUsers, [&](TUserAccount const& account) { return AccountRecord(account, system); },
      "the controller has no accounts");
  WriteSensors(writer, controller, system);
  WritePackages(writer, controller);
  WriteLog(writer, controller);
  writer.WriteMissing();
}

}  // namespace NQRVZEP20
