// SPDX-License-Identifier: Apache-2.0
#include "ControllerRecords.h"

#include "ControllerValueNames.h"
#include "EventWords.h"
#include "IpmiText.h"
#include "SensorInWords.h"
#include "providers/reasons/RunningClock.h"

namespace NQRVZEP20 {

namespace {

constexpr char const* kLogId = "ZEP:ipmi:sel";
constexpr char const *kEntry = "IPMI Get SEL Entry", *kEntryAndSensor = "IPMI Get SEL Entry, sensor data records";

template <class T>
TFinding<T> Known(T value) {
  return TFinding<T>(std::move(value));
}

TFinding<TCIMDateTime> PointInTime(std::uint64_t secondsSince1970) { return DateTimeFrom(secondsSince1970); }

std::string Hex(std::uint8_t byte) { return "0x" + HexText(std::string(1, static_cast<char>(byte))); }

// DeviceID of a sensor. Most controllers use only LUN 0.
std::string SensorIdOf(std::uint8_t owner, std::uint8_t lun, std::uint8_t number) {
  std::string const ofLun = lun == 0 ? "" : "LUN " + std::to_string(lun) + " ";
  return "ipmi " + Hex(owner) + " " + ofLun + Hex(number);
}

TFinding<std::string> MakerOf(TDeviceId const& id) {
  std::string const name = MakerName(id.fManufacturer);
  if (name.empty()) return TMissing{kMissingNotGiven, "libfreeipmi knows no maker with this number"};
  return name;
}

bool IsUnanswered(TMissing const& why) { return why.fCode == kMissingNoAnswer || why.fCode == kMissingTimeIsUp; }

// Whether every element was answered, also by a refusal; otherwise why not.
template <class TElement, class T>
TFinding<bool> AreAnswered(std::vector<TElement> const& elements, TFinding<T> TElement::*answer) {
  for (TElement const& element : elements)
    if (!(element.*answer) && IsUnanswered((element.*answer).Why())) return (element.*answer).Why();
  return true;
}

// The lists that were not read to their ends, and why.
std::vector<std::string> UnreadPartsOf(TController const& controller) {
  std::vector<std::string> parts;
  auto const note = [&](char const* list, TFinding<bool> const& isComplete) {
    if (!isComplete) parts.push_back(std::string(list) + ": " + isComplete.Why().fReason);
  };
  auto const& sensors = controller.fSensors;
  note("sensors", controller.fHasAllRecords.Then([&](bool) { return AreAnswered(sensors, &TSensorState::fStates); }));
  note("event log", controller.fLog.Then([](TEventLog const& log) { return log.fIsComplete; }));
  note("FRU data", AreAnswered(controller.fFrus, &TFruDevice::fAreas));
  return parts;
}

// The properties of all sensors, in this order.
TRecord SensorRecord(char const* className, TSensorState const& state, TComputerSystem const& system) {
  TSdrSensor const& sensor = state.fSensor;
  TRecord record(className, "IPMI sensor data records");
  system.AddDeviceKeys(record, SensorIdOf(sensor.fOwner, sensor.fLun, sensor.fNumber));
  record.Add("ElementName", Known(LabelOf(sensor)));
  record.Add("SensorType", Known(NumbersOf(sensor).fSensorType)).Names(kSensorTypeNames);
  record.Add("OtherSensorTypeDescription", Known(SensorTypeName(sensor.fType)));
  record.SetSource("IPMI Get Sensor Reading");
  record.Add("CurrentState", StateTextOf(state));
  record.Add("OperationalStatus", StatusOf(state)).Names(kOperationalStatusNames);
  return record;
}

std::string PackageKindOf(TFruArea const& area) {
  switch (area.fKind) {
    case TFruArea::EKind::kChassis:
      return "chassis";
    case TFruArea::EKind::kBoard:
      return "board";
    case TFruArea::EKind::kProduct:
      return "product";
    default:
      return "unread";
  }
}

std::uint16_t PackageTypeOf(TFruArea const& area) {
  constexpr std::uint16_t unknown = 0, other = 1, chassis = 3, card = 9;
  if (area.fKind == TFruArea::EKind::kUnread) return unknown;
  if (area.fKind == TFruArea::EKind::kChassis) return chassis;
  return area.fKind == TFruArea::EKind::kBoard ? card : other;
}

// The maker's own fields, and the name of the file that the area was written from.
TFinding<std::string> OtherTextsOf(TFruArea const& area) {
  if (area.fKind == TFruArea::EKind::kUnread) return area.fName.Why();
  std::string text;
  for (std::string const& field : area.fCustom) text += (text.empty() ? "" : "; ") + field;
  if (area.fFileId) text += (text.empty() ? "" : "; ") + ("FRU file " + *area.fFileId);
  if (text.empty()) return TMissing{kMissingNotGiven, "the area has no further fields"};
  return text;
}

TFinding<TCIMDateTime> TimeOf(TSelEntry const& entry) {
  TSelTime const time = SelTimeFrom(entry.fTime);
  constexpr std::uint32_t minute = 60, hour = 3600, day = 86400;
  if (time.fKind == TSelTime::EKind::kUnknown) return UnknownTime();  // the reason is that of Age
  if (time.fKind == TSelTime::EKind::kDate) return PointInTime(time.fSeconds);
  return TCIMDateTime(time.fSeconds / day, static_cast<unsigned short>(time.fSeconds % day / hour),
                      static_cast<unsigned short>(time.fSeconds % hour / minute),
                      static_cast<unsigned short>(time.fSeconds % minute), 0);
}

TFinding<std::string> SensorTypeNameOf(TSelEntry const& entry) {
  if (entry.fKind == TSelEntry::EKind::kEvent) return SensorTypeName(entry.fSensorType);
  return TMissing{kMissingNotApplicable, "the entry is in a form of the maker"};
}

TFinding<std::string> SensorIdOf(TSelEntry const& entry) {
  if (entry.fKind == TSelEntry::EKind::kEvent) return SensorIdOf(entry.fOwner, entry.fLun, entry.fSensorNumber);
  return TMissing{kMissingNotApplicable, "the entry is in a form of the maker"};
}

std::string EventLabelOf(TLoggedEvent const& event) {
  if (event.fSensor != nullptr) return LabelOf(*event.fSensor);
  return event.fEntry.fKind == TSelEntry::EKind::kEvent ? "sensor " + Hex(event.fEntry.fSensorNumber) : "maker's entry";
}

}  // namespace

TRecord ControllerRecord(TController const& controller, TComputerSystem const& system) {
  auto const& id = controller.fDeviceId;
  TRecord record("ZEP_ManagementController", "IPMI Get Device ID", "CIM_ManagementController");
  system.AddDeviceKeys(record, "ipmi 0x20");
  record.Add("ElementName", Known(std::string("management controller")));
  record.Add("DeviceNumber", id.Then([](TDeviceId const& known) { return known.fNumber; }));
  record.Add("DeviceRevision", id.Then([](TDeviceId const& known) { return known.fRevision; }));
  record.Add("FirmwareVersion", id.Then([](TDeviceId const& known) { return known.fFirmware; }));
  record.Add("IPMIVersion", id.Then([](TDeviceId const& known) { return known.fIpmiVersion; }));
  record.Add("Manufacturer", id.Then(MakerOf));
  record.Add("ManufacturerID", id.Then([](TDeviceId const& known) { return known.fManufacturer; }));
  record.Add("ProductID", id.Then([](TDeviceId const& known) { return known.fProduct; }));
  record.SetSource("IPMI Get System GUID");
  record.Add("GUID", controller.fGuid);
  record.SetSource("IPMI");
  record.Add("UnreadParts", Known(UnreadPartsOf(controller)));
  return record;
}

TRecord NetworkRecord(TLanChannel const& lan) {
  TRecord record("ZEP_ControllerNetwork", "IPMI Get LAN Configuration Parameters", "CIM_SettingData");
  record.AddKey("InstanceID", "ZEP:ipmi:channel " + std::to_string(lan.fNumber));
  record.Add("ElementName", Known("channel " + std::to_string(lan.fNumber)));
  record.Add("Channel", Known(lan.fNumber));
  record.Add("IPv4Address", lan.fAddress);
  record.Add("AddressSource", lan.fSource);
  record.Add("SubnetMask", lan.fMask);
  record.Add("DefaultGateway", lan.fGateway);
  record.Add("MACAddress", lan.fMac);
  record.Add("VLANID", lan.fVlan);
  return record;
}

TRecord AccountRecord(TUserAccount const& account, TComputerSystem const& system) {
  constexpr std::uint16_t enabled = 2, disabled = 3;
  TRecord record("ZEP_ControllerAccount", "IPMI Get User Access", "CIM_Account");
  system.AddHostedKeys(record, std::to_string(account.fNumber));
  record.Add("EnabledState", account.fIsEnabled.Then([&](bool is) { return is ? enabled : disabled; })).Names(kEnabledStateNames);
  record.Add("Channel", Known(account.fChannel));
  record.Add("Privilege", Known(account.fPrivilege));
  record.Add("HasLANAccess", Known(account.fHasLanAccess));
  record.SetSource("IPMI Get User Name");
  record.Add("UserID", account.fName);
  return record;
}

TRecord StateSensorRecord(TSensorState const& state, TComputerSystem const& system) {
  return SensorRecord("CIM_Sensor", state, system);
}

TRecord NumericSensorRecord(TSensorState const& state, TComputerSystem const& system) {
  TSensorNumbers const numbers = NumbersOf(state.fSensor);
  auto const threshold = [&](TRawThresholds::EPlace place) { return ScaledThreshold(state, place); };
  TRecord record = SensorRecord("CIM_NumericSensor", state, system);
  record.Add("CurrentReading", state.fRaw.Then([&](std::uint8_t raw) { return ScaledValue(state.fSensor, raw); }));
  record.SetSource("IPMI sensor data records");
  record.Add("BaseUnits", Known(numbers.fBaseUnits)).Names(kBaseUnitsNames);
  record.Add("UnitModifier", Known(numbers.fUnitModifier));
  record.Add("RateUnits", numbers.fRateUnits).Names(kRateUnitsNames);
  record.Add("Description", UnitDescriptionOf(state.fSensor));
  record.SetSource("IPMI Get Sensor Thresholds");
  record.Add("LowerThresholdNonCritical", threshold(TRawThresholds::kLowerNonCritical));
  record.Add("UpperThresholdNonCritical", threshold(TRawThresholds::kUpperNonCritical));
  record.Add("LowerThresholdCritical", threshold(TRawThresholds::kLowerCritical));
  record.Add("UpperThresholdCritical", threshold(TRawThresholds::kUpperCritical));
  record.Add("LowerThresholdFatal", threshold(TRawThresholds::kLowerFatal));
  record.Add("UpperThresholdFatal", threshold(TRawThresholds::kUpperFatal));
  return record;
}

TRecord PackageRecord(TFruDevice const& device, TFruArea const& area) {
  std::string const kind = PackageKindOf(area);
  TRecord record("CIM_PhysicalPackage", "IPMI FRU data");
  record.AddKey("CreationClassName", "CIM_PhysicalPackage");
  std::string const owner = device.fController == kThisController ? "" : Hex(device.fController) + " ";
  record.AddKey("Tag", "ipmi " + owner + "FRU " + std::to_string(device.fNumber) + " " + kind);
  record.Add("ElementName", Known(device.fName + " " + kind));
  record.Add("PackageType", Known(PackageTypeOf(area))).Names(kPackageTypeNames);
  record.Add("Manufacturer", area.fManufacturer);
  record.Add("Model", area.fName);
  record.Add("PartNumber", area.fPartNumber);
  record.Add("Version", area.fVersion);
  record.Add("SerialNumber", area.fSerialNumber);
  record.Add("UserTracking", area.fAssetTag);
  record.Add("ManufactureDate", area.fManufactureTime.Then(PointInTime));
  record.Add("OtherIdentifyingInfo", OtherTextsOf(area));
  return record;
}

TRecord LogRecord(TEventLog const& log) {
  TRecord record("ZEP_EventLog", "IPMI Get SEL Info", "CIM_RecordLog");
  record.AddKey("InstanceID", kLogId);
  record.Add("ElementName", Known(std::string("system event log")));
  record.Add("CurrentNumberOfRecords", Known(static_cast<std::uint64_t>(log.fCount)));
  record.Add("MaxNumberOfRecords", log.fRoomFor.Then([&](std::uint64_t room) { return room + log.fCount; }));
  record.Add("FreeRecords", log.fRoomFor);
  record.Add("HasLostRecords", Known(log.fHasLostEntries));
  record.SetSource("IPMI Get SEL Time");
  record.Add("ClockTime", log.fClock.Then(PointInTime));
  return record;
}

TRecord EntryRecord(TLoggedEvent const& event) {
  std::string const label = EventLabelOf(event);
  TRecord record("ZEP_EventLogEntry", kEntry, "CIM_LogRecord");
  record.AddKey("LogCreationClassName", "ZEP_EventLog");
  record.AddKey("LogName", kLogId);
  record.AddKey("CreationClassName", "ZEP_EventLogEntry");
  record.AddKey("RecordID", std::to_string(event.fEntry.fId));
  record.AddKey("MessageTimestamp", TimeOf(event.fEntry));
  record.SetSource(kEntryAndSensor);
  record.Add("ElementName", Known(label));
  record.SetSource(kEntry);
  record.Add("PerceivedSeverity", Known(static_cast<std::uint16_t>(SeverityOf(event.fEntry)))).Names(kPerceivedSeverityNames);
  record.SetSource(kEntryAndSensor);
  record.Add("RecordData", Known(label + ": " + EventText(event.fEntry, event.fSensor)));
  record.SetSource(kEntry);
  record.Add("SensorTypeName", SensorTypeNameOf(event.fEntry));
  record.Add("SensorDeviceID", SensorIdOf(event.fEntry));
  record.SetSource("IPMI Get SEL Entry, Get SEL Time");
  record.Add("Age", event.fAge).Unit("second");
  record.SetSource("IPMI Get SEL Entry, Get Sensor Reading");
  record.Add("HasEnded", Known(event.fHasEnded));
  return record;
}

}  // namespace NQRVZEP20
