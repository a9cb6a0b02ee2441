// SPDX-License-Identifier: Apache-2.0
#include "DriveRecords.h"
#include "TStorage.h"

namespace NQRVZEP20 {

namespace {

constexpr TAssociation kRealizes{"CIM_Realizes", "Antecedent", "CIM_PhysicalElement", "Dependent", "CIM_LogicalDevice"};
constexpr TAssociation kSoftware{"CIM_ElementSoftwareIdentity", "Antecedent", "CIM_SoftwareIdentity", "Dependent",
                                 "CIM_ManagedElement"};

TSmartReport HealthOf(TStorage const& storage, TDisk const& disk) {
  auto const found = storage.fHealth.find(disk.fDevice.fName);
  return found == storage.fHealth.end() ? NoSmartReport(TMissing()) : found->second;
}

TRecord RecordOf(TStorage const& storage, TDisk const& disk, TBlockDevice::EKind kind) {
  switch (kind) {
    case TBlockDevice::kOptical:
      return DriveRecord("CIM_CDROMDrive", storage.fFiles, disk, storage.fSystem);
    case TBlockDevice::kDiskette:
      return DriveRecord("CIM_DisketteDrive", storage.fFiles, disk, storage.fSystem);
    case TBlockDevice::kTape:
      return DriveRecord("CIM_TapeDrive", storage.fFiles, disk, storage.fSystem);
    default:
      return DiskDriveRecord(storage.fFiles, disk, HealthOf(storage, disk), storage.fSystem);
  }
}

void WriteDrivesOf(TStorage& storage, TBlockDevice::EKind kind, char const* whyNone) {
  std::vector<TRecord> records;
  for (TDisk const& disk : storage.fDisks) {
    if (disk.fDevice.fKind != kind) continue;
    records.push_back(RecordOf(storage, disk, kind));
    storage.fDrives.emplace(disk.fDevice.fName, records.back());
  }
  storage.fWriter.Write(RecordOf(storage, storage.fNoDisk, kind), records, {kMissingNotGiven, whyNone});
  for (TRecord const& record : records) storage.fWriter.Associate(kSystemDevice, storage.fSystemRecord, record);
}

TMissing NoDrives() { return {kMissingNotGiven, "the kernel lists no drives"}; }

// The packages of drives, and the boards of controllers that are not drives themselves.
void WritePackages(TStorage& storage) {
  std::vector<TRecord> packages;
  for (TDisk const& disk : storage.fDisks) {
    packages.push_back(PackageRecord(disk));
    storage.fPackages.emplace(disk.fDevice.fName, packages.back());
  }
  for (TController const& controller : storage.fControllers) {
    if (controller.IsNvme()) continue;
    packages.push_back(BoardRecord(controller));
    storage.fPackages.emplace(controller.fAddress, packages.back());
  }
  storage.fWriter.Write(PackageRecord(storage.fNoDisk), packages, NoDrives());
  for (auto const& [name, drive] : storage.fDrives) storage.fWriter.Associate(kRealizes, storage.fPackages.at(name), drive);
}

void WriteFirmware(TStorage& storage) {
  std::vector<TRecord> records;
  for (TDisk const& disk : storage.fDisks) records.push_back(FirmwareRecord(disk));
  storage.fWriter.Write(FirmwareRecord(storage.fNoDisk), records, NoDrives());
  for (std::size_t i = 0; i < records.size(); ++i)
    storage.fWriter.Associate(kSoftware, records[i], storage.fDrives.at(storage.fDisks[i].fDevice.fName));
}

}  // namespace

void WriteDrives(TStorage& storage) {
  WriteDrivesOf(storage, TBlockDevice::kDisk,
                storage.fFiles.Exists("/sys/class/block")
                    ? "the kernel lists no disk drives: no device in /sys/class/block is a disk"
                    : "the kernel lists no disk drives: /sys/class/block does not exist");
  WriteDrivesOf(storage, TBlockDevice::kOptical, "the kernel lists no optical drives: no device in /sys/class/block is one");
  WriteDrivesOf(storage, TBlockDevice::kDiskette, "the kernel lists no floppy drives: no device in /sys/class/block is one");
  WriteDrivesOf(storage, TBlockDevice::kTape, "the kernel lists no tape drives: /sys/class/scsi_tape has none");
  WritePackages(storage);
  WriteFirmware(storage);
}

}  // namespace NQRVZEP20
