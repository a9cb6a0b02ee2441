// SPDX-License-Identifier: Apache-2.0
#include "DriveRecords.h"
#include "TStorage.h"

namespace NQRVZEP20 {

namespace {

constexpr TAssociation kRealizes{"CIM_Realizes", "Antecedent", "CIM_PhysicalElement", "Dependent", "CIM_LogicalDevice"};
constexpr TAssociation kSoftware{"CIM_ElementSoftwareIdentity", "Antecedent", "CIM_SoftwareIdentity", "Dependent",
                                 "CIM_ManagedElement"};

TRecord RecordOf(TStorage const& storage, TDisk const& disk, TBlockDevice::EKind kind) {
  switch (kind) {
    case TBlockDevice::kOptical:
      return DriveRecord("CIM_CDROMDrive", storage.fFiles, disk, storage.fSystem);
    case TBlockDevice::kDiskette:
      return DriveRecord("CIM_DisketteDrive", storage.fFiles, disk, storage.fSystem);
    case TBlockDevice::kTape:
      return DriveRecord("CIM_TapeDrive", storage.fFiles, disk, storage.fSystem);
    default:
      return DiskDriveRecord(storage.fFiles, disk, storage.fSystem);
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

}  // namespace

void WriteDrives(TStorage& storage) {
  WriteDrivesOf(storage, TBlockDevice::kDisk, "the kernel lists no disk drives: no device in /sys/class/block is a disk");
  WriteDrivesOf(storage, TBlockDevice::kOptical, "the kernel lists no optical drives: no device in /sys/class/block is one");
  WriteDrivesOf(storage, TBlockDevice::kDiskette, "the kernel lists no floppy drives: no device in /sys/class/block is one");
  WriteDrivesOf(storage, TBlockDevice::kTape, "the kernel lists no tape drives: /sys/class/scsi_tape has none");

  TMissing const whyNone{kMissingNotGiven, "the kernel lists no drives"};
  std::vector<TRecord> packages, firmware;
  for (TDisk const& disk : storage.fDisks) {
    packages.push_back(PackageRecord(disk));
    firmware.push_back(FirmwareRecord(disk));
  }
  storage.fWriter.Write(PackageRecord(storage.fNoDisk), packages, whyNone);
  storage.fWriter.Write(FirmwareRecord(storage.fNoDisk), firmware, whyNone);
  for (std::size_t i = 0; i < storage.fDisks.size(); ++i) {
    std::string const& name = storage.fDisks[i].fDevice.fName;
    storage.fPackages.emplace(name, packages[i]);
    storage.fWriter.Associate(kRealizes, packages[i], storage.fDrives.at(name));
    storage.fWriter.Associate(kSoftware, firmware[i], storage.fDrives.at(name));
  }
}

}  // namespace NQRVZEP20
