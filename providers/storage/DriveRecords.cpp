// SPDX-License-Identifier: Apache-2.0
#include "DriveRecords.h"

#include "ValueNames.h"
#include "providers/reasons/OperationalStatusNames.h"
#include "providers/reasons/TIdentifiers.h"

#include <algorithm>
#include <iterator>
#include <string>
#include <vector>

namespace NQRVZEP20 {

namespace {

using TText = TFinding<std::string>;
using TCode = TFinding<unsigned short>;
using TCodes = TFinding<std::vector<unsigned short>>;

constexpr char const* kSource = "sysfs, udev";

// Values of the schema (ValueNames.h).
constexpr unsigned short kSequentialAccess = 2, kRandomAccess = 3, kWriting = 4, kRemovableMedia = 7;
constexpr unsigned short kPredictiveFailure = 5, kHealthy = 5, kDegraded = 10, kMajorFailure = 20;
constexpr unsigned short kHardDisk = 2, kSolidState = 3;
constexpr unsigned short kOtherFormFactor = 1, kFormFactor525 = 3;
constexpr unsigned short kOther = 1, kATA = 3, kSATA = 4, kSAS = 5, kFC = 6;
constexpr unsigned short kStorageMediaPackage = 15;
constexpr unsigned short kFirmwareClass = 10;

struct TStateStatus {
  char const* fState;
  unsigned short fStatus;  // of the property OperationalStatus
};
constexpr TStateStatus kStates[] = {
    {"running", 2},          {"live", 2},     {"quiesce", 10},  {"blocked", 10},    {"created-blocked", 10},
    {"created", 8},          {"new", 8},      {"resetting", 8}, {"connecting", 12}, {"deleting", 9},
    {"cancel", 9},           {"deleted", 10}, {"dead", 6},      {"offline", 6},     {"transport-offline", 13},
    {"deleting (no IO)", 9},
};

// The state of a drive: values of OperationalStatus, and a text for each.
struct TStatus {
  std::vector<unsigned short> fCodes;
  std::vector<std::string> fTexts;
};

TFinding<TStatus> StatusFrom(std::string const& state) {
  auto const found = std::find_if(std::begin(kStates), std::end(kStates), [&](auto const& row) { return row.fState == state; });
  if (found == std::end(kStates)) return TMissing{kMissingUnexpected, "the kernel reports the state \"" + state + "\""};
  return TStatus{{found->fStatus}, {state}};
}

// The state that the kernel reports, and that of a disk that is failing by its own judgement.
TFinding<TStatus> StatusOf(TDisk const& disk, TSmartReport const& health) {
  TFinding<TStatus> const ofKernel = disk.fState.Then(StatusFrom);
  if (!health.fPassed || *health.fPassed || IsOnlyTemperature(health)) return ofKernel;
  TStatus status = ofKernel ? *ofKernel : TStatus();
  status.fCodes.push_back(kPredictiveFailure);
  status.fTexts.emplace_back("the disk reports that it is failing");
  return status;
}

TCode HealthStateOf(TSmartReport const& health) {
  if (IsOnlyTemperature(health)) return kDegraded;
  return health.fPassed.Then([](bool isHealthy) { return isHealthy ? kHealthy : kMajorFailure; });
}

TIdentifiers IdentifiersOf(TMachineFiles const& files, TDisk const& disk) {
  TIdentifiers identifiers;
  for (TDesignator const& designator : disk.fDesignators) identifiers.Add(designator.fFormat, designator.fText);
  identifiers.Add("Serial number", disk.fSerialNumber);
  identifiers.Add("SCSI address", disk.fAttachment.ScsiAddress());
  identifiers.Add("NVMe qualified name", files.Line(disk.fDevice.File("device/subsysnqn")));
  identifiers.Add("Driver", files.RealName(disk.fDevice.File("device/driver")));
  return identifiers;
}

TCodes CapabilitiesOf(TMachineFiles const& files, TBlockDevice const& drive) {
  std::vector<unsigned short> codes{drive.fKind == TBlockDevice::kTape ? kSequentialAccess : kRandomAccess};
  auto const readOnly = files.Number<int>(drive.File("ro")), removable = files.Number<int>(drive.File("removable"));
  if (drive.fKind == TBlockDevice::kTape || (readOnly && *readOnly == 0)) codes.push_back(kWriting);
  if (drive.fKind == TBlockDevice::kTape || (removable && *removable != 0)) codes.push_back(kRemovableMedia);
  return codes;
}

// The schema counts in units of 1000 bytes.
TFinding<unsigned long> MediaSizeOf(TMachineFiles const& files, TBlockDevice const& drive) {
  return SizeOf(files, drive).Then([](unsigned long bytes) { return bytes / 1000; });
}

// ---- Disks ----

bool IsVirtual(TDisk const& disk) {
  return disk.fAttachment.fTransport && (*disk.fAttachment.fTransport == "virtio" || *disk.fAttachment.fTransport == "xen");
}

TCode DiskTypeOf(TMachineFiles const& files, TDisk const& disk, TFinding<unsigned> const& rotations) {
  if (IsVirtual(disk)) return TMissing{kMissingNotApplicable, "the kernel does not know which medium a virtual disk uses"};
  if (rotations) return *rotations == 0 ? kSolidState : kHardDisk;
  return files.Number<int>(disk.fDevice.File("queue/rotational")).Then([](int isRotating) {
    return isRotating != 0 ? kHardDisk : kSolidState;
  });
}

TFinding<unsigned int> RotationsOf(TFinding<unsigned> const& known) {
  return known.Then([](unsigned rotations) -> TFinding<unsigned int> {
    if (rotations == 0) return TMissing{kMissingNotApplicable, "this disk does not rotate"};
    return rotations;
  });
}

// The schema numbers the same sizes from 3 on.
unsigned short FormFactorFrom(unsigned code) {
  constexpr unsigned kSmallest = 4;
  return code == 0 || code > kSmallest ? kOtherFormFactor : static_cast<unsigned short>(code - 1 + kFormFactor525);
}

struct TInterconnect {
  char const* fTransport;
  unsigned short fType;
  char const* fOtherName;
};
constexpr TInterconnect kInterconnects[] = {
    {"sata", kSATA, nullptr},   {"ata", kATA, nullptr},       {"sas", kSAS, nullptr},
    {"fc", kFC, nullptr},       {"nvme", kOther, "NVMe"},     {"usb", kOther, "USB"},
    {"iscsi", kOther, "iSCSI"}, {"virtio", kOther, "virtio"}, {"spi", kOther, "SCSI parallel interface"},
    {"mmc", kOther, "MMC"},     {"sd", kOther, "SD"},         {"xen", kOther, "Xen"},
    {"ufs", kOther, "UFS"},
};

TInterconnect const& InterconnectOf(std::string const& transport) {
  auto const isWanted = [&](TInterconnect const& row) { return row.fTransport == transport; };
  return *std::find_if(std::begin(kInterconnects), std::end(kInterconnects) - 1, isWanted);
}

TText OtherInterconnectOf(std::string const& transport) {
  TInterconnect const& interconnect = InterconnectOf(transport);
  if (interconnect.fOtherName == nullptr) return TMissing{kMissingNotApplicable, "InterconnectType names the interconnect"};
  return std::string(interconnect.fOtherName);
}

// The properties of drives of all kinds.
TRecord AnyDriveRecord(char const* className, TMachineFiles const& files, TDisk const& disk, TFinding<TStatus> const& status,
                       TComputerSystem const& system) {
  TIdentifiers const identifiers = IdentifiersOf(files, disk);
  TMissing const noIdentifier{kMissingNotGiven, "neither the drive nor the kernel reports an identifier"};
  TBlockDevice const& device = disk.fDevice;
  TRecord record(className, kSource);
  system.AddDeviceKeys(record, device.fName);
  record.Add("Name", TText(device.Node()));
  record.Add("ElementName", disk.fModel);
  record.Add("OtherIdentifyingInfo", identifiers.Values(noIdentifier));
  record.Add("IdentifyingDescriptions", identifiers.Descriptions(noIdentifier));
  record.Add("OperationalStatus", status.Then([](TStatus const& values) { return values.fCodes; }))
      .Names(kOperationalStatusNames);
  record.Add("StatusDescriptions", status.Then([](TStatus const& values) { return values.fTexts; }));
  record.Add("Capabilities", CapabilitiesOf(files, device)).Names(kCapabilitiesNames);
  record.Add("MaxMediaSize", MediaSizeOf(files, device)).Unit("byte * 10^3");
  record.Add("DefaultBlockSize", files.Number<unsigned long>(device.File("queue/logical_block_size"))).Unit("byte");
  return record;
}

}  // namespace

TRecord DriveRecord(char const* className, TMachineFiles const& files, TDisk const& disk, TComputerSystem const& system) {
  return AnyDriveRecord(className, files, disk, disk.fState.Then(StatusFrom), system);
}

TRecord DiskDriveRecord(TMachineFiles const& files, TDisk const& disk, TSmartReport const& health,
                        TComputerSystem const& system) {
  TText const& transport = disk.fAttachment.fTransport;
  TFinding<unsigned> const& rotations = disk.fRotationsPerMinute ? disk.fRotationsPerMinute : health.fRotationsPerMinute;
  TRecord record = AnyDriveRecord("CIM_DiskDrive", files, disk, StatusOf(disk, health), system);
  record.Add("HealthState", HealthStateOf(health)).Names(kHealthStateNames);
  record.Add("DiskType", DiskTypeOf(files, disk, rotations)).Names(kDiskTypeNames);
  record.Add("RPM", RotationsOf(rotations)).Unit("revolution / minute");
  record.Add("FormFactor", (disk.fFormFactor ? disk.fFormFactor : health.fFormFactor).Then(FormFactorFrom))
      .Names(kFormFactorNames);
  record.Add("InterconnectType", transport.Then([](auto const& name) { return InterconnectOf(name).fType; }))
      .Names(kInterconnectTypeNames);
  record.Add("OtherInterconnectType", transport.Then(OtherInterconnectOf));
  record.Add("InterconnectSpeed", disk.fAttachment.fSpeed).Unit("bit / second");
  return record;
}

TRecord PackageRecord(TDisk const& disk) {
  TRecord record("CIM_PhysicalPackage", kSource);
  record.AddKey("CreationClassName", "CIM_PhysicalPackage");
  record.AddKey("Tag", "disk:" + disk.fDevice.fName);
  record.Add("ElementName", disk.fModel);
  record.Add("Manufacturer", disk.fVendor);
  record.Add("Model", disk.fModel);
  record.Add("SerialNumber", disk.fSerialNumber);
  record.Add("PackageType", TCode(kStorageMediaPackage)).Names(kPackageTypeNames);
  return record;
}

TRecord FirmwareRecord(TDisk const& disk) {
  TRecord record("CIM_SoftwareIdentity", kSource);
  record.AddKey("InstanceID", "ZEP:firmware:" + disk.fDevice.fName);
  record.AddOwn("ElementName", "Firmware of " + disk.fDevice.fName);
  record.Add("VersionString", disk.fFirmware);
  record.Add("Classifications", TCodes(std::vector<unsigned short>{kFirmwareClass})).Names(kClassificationsNames);
  return record;
}

}  // namespace NQRVZEP20
