// SPDX-License-Identifier: Apache-2.0
#include "SensorRecords.h"

#include "providers/reasons/SensorValueNames.h"
#include "providers/reasons/TIdentifiers.h"

namespace NQRVZEP20 {

namespace {

using EKind = TSensor::EKind;

constexpr std::uint16_t kOK = 2, kStressed = 4, kError = 6, kStopped = 10;

struct TKindNumbers {
  std::uint16_t fSensorType, fBaseUnits;
  std::int32_t fUnitModifier;  // readings are in this power of ten of the unit
};

TKindNumbers NumbersOf(EKind kind) {
  constexpr std::uint16_t other = 1;
  switch (kind) {
    case EKind::kTemperature:
      return {2, 2, -3};
    case EKind::kFan:
      return {5, 19, 0};
    case EKind::kVoltage:
      return {3, 5, -3};
    case EKind::kCurrent:
      return {4, 6, -3};
    case EKind::kPower:
      return {13, 7, -3};
    default:
      return {9, other, -3};
  }
}

std::vector<std::string> PossibleStates() {
  return {"Normal", "Lower Non-Critical", "Upper Non-Critical", "Lower Critical", "Upper Critical", "Upper Fatal", "Fault"};
}

std::vector<std::uint16_t> StatusFrom(std::string const& state) {
  if (state == "Normal") return {kOK};
  return {state.find("Non-Critical") != std::string::npos ? kStressed : kError};
}

std::string NameOf(TSensor const& sensor) { return sensor.fChip + " " + sensor.fName; }

// The label of the board's maker, or else the name of the chip and its sensor.
TFinding<std::string> ElementNameOf(TSensor const& sensor) {
  return sensor.fLabel ? sensor.fLabel : TFinding<std::string>(NameOf(sensor));
}

struct TStatus {
  std::uint16_t fCode;
  std::string fText;
};

TFinding<TStatus> StatusOf(TPowerSupply const& supply) {
  bool const isBroken = supply.fHealth && *supply.fHealth != "Good" && *supply.fHealth != "Unknown";
  if (isBroken) return TStatus{kError, *supply.fHealth};
  return supply.fIsOnline.Then([](bool isOnline) { return isOnline ? TStatus{kOK, "online"} : TStatus{kStopped, "offline"}; });
}

}  // namespace

TRecord SensorRecord(TSensor const& sensor, TComputerSystem const& system) {
  TKindNumbers const numbers = NumbersOf(sensor.fKind);
  auto const state = StateOf(sensor);
  TRecord record("CIM_NumericSensor", "/sys/class/hwmon/");
  system.AddDeviceKeys(record, NameOf(sensor));
  record.Add("ElementName", ElementNameOf(sensor));
  record.Add("Description", TFinding<std::string>(sensor.fPath));
  record.Add("OperationalStatus", state.Then(StatusFrom)).Names(kOperationalStatusNames);
  record.Add("SensorType", TFinding<std::uint16_t>(numbers.fSensorType)).Names(kSensorTypeNames);
  record.Add("PossibleStates", TFinding<std::vector<std::string>>(PossibleStates()));
  record.Add("CurrentState", state);
  record.Add("BaseUnits", TFinding<std::uint16_t>(numbers.fBaseUnits)).Names(kBaseUnitsNames);
  record.Add("UnitModifier", TFinding<std::int32_t>(numbers.fUnitModifier));
  record.Add("CurrentReading", sensor.fReading);
  record.Add("LowerThresholdNonCritical", sensor.fLowerNonCritical);
  record.Add("UpperThresholdNonCritical", sensor.fUpperNonCritical);
  record.Add("LowerThresholdCritical", sensor.fLowerCritical);
  record.Add("UpperThresholdCritical", sensor.fUpperCritical);
  record.Add("UpperThresholdFatal", sensor.fUpperFatal);
  return record;
}

TRecord FanRecord(TSensor const& sensor, TComputerSystem const& system) {
  TRecord record("CIM_Fan", "/sys/class/hwmon/");
  system.AddDeviceKeys(record, NameOf(sensor));
  record.Add("ElementName", ElementNameOf(sensor));
  record.Add("OperationalStatus", StateOf(sensor).Then(StatusFrom)).Names(kOperationalStatusNames);
  return record;
}

TRecord PowerSupplyRecord(TPowerSupply const& supply, TComputerSystem const& system) {
  using TCodes = std::vector<std::uint16_t>;
  using TTexts = std::vector<std::string>;
  auto const status = StatusOf(supply);
  TRecord record("CIM_PowerSupply", "/sys/class/power_supply/");
  system.AddDeviceKeys(record, supply.fName);
  record.Add("OperationalStatus", status.Then([](TStatus const& each) { return TCodes{each.fCode}; }))
      .Names(kOperationalStatusNames);
  record.Add("StatusDescriptions", status.Then([](TStatus const& each) { return TTexts{each.fText}; }));
  TIdentifiers identifiers;
  identifiers.Add("Manufacturer", supply.fMaker);
  identifiers.Add("Model", supply.fModel);
  identifiers.Add("SerialNumber", supply.fSerialNumber);
  identifiers.AddTo(record);
  return record;
}

TRecord MemoryErrorsRecord(TMemoryErrors const& errors) {
  TRecord record("ZEP_MemoryErrors", "/sys/devices/system/edac/", "CIM_StatisticalData");
  record.AddKey("InstanceID", "ZEP:edac:" + errors.fName);
  record.Add("ElementName", errors.fLabel ? errors.fLabel : TFinding<std::string>(errors.fName));
  record.Add("Location", errors.fLocation);
  record.Add("CorrectedErrors", errors.fCorrected);
  record.Add("UncorrectedErrors", errors.fUncorrected);
  return record;
}

TRecord PciErrorsRecord(TPciErrors const& errors) {
  TRecord record("ZEP_PCIErrors", "/sys/bus/pci/devices/", "CIM_StatisticalData");
  record.AddKey("InstanceID", "ZEP:aer:" + errors.fAddress);
  record.Add("ElementName", TFinding<std::string>(errors.fAddress));
  record.Add("CorrectableErrors", errors.fCorrectable);
  record.Add("NonFatalErrors", errors.fNonFatal);
  record.Add("FatalErrors", errors.fFatal);
  record.Add("ErrorKinds", errors.fKinds);
  return record;
}

}  // namespace NQRVZEP20
