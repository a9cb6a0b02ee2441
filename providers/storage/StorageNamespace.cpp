// SPDX-License-Identifier: Apache-2.0
#include "StorageNamespace.h"

#include "DriveRecords.h"
#include "ExtentRecords.h"
#include "TBlockDevice.h"
#include "TDisk.h"
#include "TUdevRecord.h"
#include "providers/memory/TMemoryNamespace.h"
#include "providers/reasons/TComputerSystem.h"
#include "providers/reasons/TRecordWriter.h"

#include <map>
#include <string>
#include <utility>
#include <vector>

namespace NQRVZEP20 {

namespace {

constexpr TAssociation kRealizes{"CIM_Realizes", "Antecedent", "CIM_PhysicalElement", "Dependent", "CIM_LogicalDevice"};
constexpr TAssociation kSoftware{"CIM_ElementSoftwareIdentity", "Antecedent", "CIM_SoftwareIdentity", "Dependent",
                                 "CIM_ManagedElement"};
constexpr TAssociation kMediaPresent{"CIM_MediaPresent", "Antecedent", "CIM_MediaAccessDevice", "Dependent", "CIM_StorageExtent"};
constexpr TAssociation kBasedOn{"CIM_BasedOn", "Antecedent", "CIM_StorageExtent", "Dependent", "CIM_StorageExtent"};

// The steps that fill a namespace. The records of devices are kept by the kernel's names, for the associations.
class TStorageFill {
public:
  TStorageFill(TMemoryNamespace& ns, TMachineFiles const& files)
      : fFiles(files), fSystem(files), fWriter(ns), fDevices(BlockDevicesOf(files)) {}

  void Run() {
    fWriter.Write(fSystem.Record());
    ReadDrives();
    WriteDrives();
    WritePackages();
    WriteMedia();
    WritePartitions();
    WriteOtherExtents();
    for (auto const& [name, drive] : fDrives) fWriter.Associate(kSystemDevice, fSystem.Record(), drive);
    for (auto const& [name, extent] : fExtents) fWriter.Associate(kSystemDevice, fSystem.Record(), extent);
    fWriter.WriteMissing();
  }

private:
  using TRecords = std::vector<TRecord>;
  using TByName = std::map<std::string, TRecord>;

  void ReadDrives() {
    for (TBlockDevice const& device : fDevices)
      if (device.IsDrive()) fDisks.push_back(DiskOf(fFiles, device));
    for (TBlockDevice const& drive : TapeDrivesOf(fFiles)) fDisks.push_back(DiskOf(fFiles, drive));
  }

  TUdevRecord UdevOf(TBlockDevice const& device) const { return TUdevRecord::Of(fFiles, NumberOf(fFiles, device)); }

  // ---- Drives ----

  TRecord RecordOf(TDisk const& disk, TBlockDevice::EKind kind) const {
    switch (kind) {
      case TBlockDevice::kOptical:
        return DriveRecord("CIM_CDROMDrive", fFiles, disk, fSystem);
      case TBlockDevice::kDiskette:
        return DriveRecord("CIM_DisketteDrive", fFiles, disk, fSystem);
      case TBlockDevice::kTape:
        return DriveRecord("CIM_TapeDrive", fFiles, disk, fSystem);
      default:
        return DiskDriveRecord(fFiles, disk, fSystem);
    }
  }

  void WriteDrives() {
    WriteDrivesOf(TBlockDevice::kDisk, "the kernel lists no disk drives: no device in /sys/class/block is a disk");
    WriteDrivesOf(TBlockDevice::kOptical, "the kernel lists no optical drives: no device in /sys/class/block is one");
    WriteDrivesOf(TBlockDevice::kDiskette, "the kernel lists no floppy drives: no device in /sys/class/block is one");
    WriteDrivesOf(TBlockDevice::kTape, "the kernel lists no tape drives: /sys/class/scsi_tape has none");
  }

  void WriteDrivesOf(TBlockDevice::EKind kind, char const* whyNone) {
    TRecords records;
    for (TDisk const& disk : fDisks) {
      if (disk.fDevice.fKind != kind) continue;
      records.push_back(RecordOf(disk, kind));
      fDrives.emplace(disk.fDevice.fName, records.back());
    }
    fWriter.Write(RecordOf(NoDisk(), kind), records, {kMissingNotGiven, whyNone});
  }

  // A disk without values, for the declaration of a class.
  TDisk NoDisk() const { return DiskOf(fFiles, TBlockDevice()); }

  void WritePackages() {
    TMissing const whyNone{kMissingNotGiven, "the kernel lists no drives"};
    TRecords packages, firmware;
    for (TDisk const& disk : fDisks) {
      packages.push_back(PackageRecord(disk));
      firmware.push_back(FirmwareRecord(disk));
    }
    fWriter.Write(PackageRecord(NoDisk()), packages, whyNone);
    fWriter.Write(FirmwareRecord(NoDisk()), firmware, whyNone);
    for (std::size_t i = 0; i < fDisks.size(); ++i) {
      TRecord const& drive = fDrives.at(fDisks[i].fDevice.fName);
      fWriter.Associate(kRealizes, packages[i], drive);
      fWriter.Associate(kSoftware, firmware[i], drive);
    }
  }

  // ---- Extents ----

  TRecord MediumOf(TDisk const& disk) const {
    return ExtentRecord("CIM_StorageExtent", fFiles, disk.fDevice, fSystem, disk.fModel);
  }

  void WriteMedia() {
    TRecords media;
    std::vector<TRecord const*> drives;
    for (TDisk const& disk : fDisks) {
      if (!SizeOf(fFiles, disk.fDevice)) continue;
      media.push_back(MediumOf(disk));
      drives.push_back(&fDrives.at(disk.fDevice.fName));
      fExtents.emplace(disk.fDevice.fName, media.back());
    }
    fWriter.Write(MediumOf(NoDisk()), media, {kMissingNotGiven, "no drive has a medium"});
    for (std::size_t i = 0; i < media.size(); ++i) fWriter.Associate(kMediaPresent, *drives[i], media[i]);
  }

  void WritePartitions() {
    std::vector<TPartition> partitions;
    for (TBlockDevice const& device : fDevices)
      if (device.fKind == TBlockDevice::kPartition) partitions.push_back(PartitionOf(fFiles, device, UdevOf(device)));
    WritePartitionsOf(partitions, EPartitionTable::kOther, "no partition is in a table that is neither an MBR nor a GPT");
    WritePartitionsOf(partitions, EPartitionTable::kMbr, "no partition is known to be in an MBR");
    WritePartitionsOf(partitions, EPartitionTable::kGpt, "no partition is known to be in a GPT");

    for (TPartition const& partition : partitions) {
      auto const whole = fExtents.find(partition.fDevice.fWhole);
      if (whole == fExtents.end()) continue;
      fWriter.Associate(kBasedOn, whole->second, fExtents.at(partition.fDevice.fName),
                        BasedOnRecord(partition.fStart, partition.fSize));
    }
  }

  void WritePartitionsOf(std::vector<TPartition> const& partitions, EPartitionTable table, char const* whyNone) {
    TPartition shape;
    shape.fTable = table;
    TRecords records;
    for (TPartition const& partition : partitions) {
      if (partition.fTable != table) continue;
      records.push_back(PartitionRecord(fFiles, partition, fSystem));
      fExtents.emplace(partition.fDevice.fName, records.back());
    }
    fWriter.Write(PartitionRecord(fFiles, shape, fSystem), records, {kMissingNotGiven, whyNone});
  }

  TRecord OtherRecord(TBlockDevice const& device) const {
    return ExtentRecord("CIM_LogicalDisk", fFiles, device, fSystem,
                        TMissing{kMissingNotGiven, "the kernel has no other name for this device"});
  }

  void WriteOtherExtents() {
    TRecords records;
    for (TBlockDevice const& device : fDevices) {
      if (device.fKind != TBlockDevice::kOther) continue;
      records.push_back(OtherRecord(device));
      fExtents.emplace(device.fName, records.back());
    }
    fWriter.Write(OtherRecord(TBlockDevice()), records,
                  {kMissingNotGiven, "the kernel lists no device without hardware, such as a loop device that is set up"});
  }

  TMachineFiles const& fFiles;
  TComputerSystem const fSystem;
  TRecordWriter fWriter;
  std::vector<TBlockDevice> const fDevices;
  std::vector<TDisk> fDisks;  // and tape drives
  TByName fDrives, fExtents;
};

}  // namespace

void FillStorageNamespace(TMemoryNamespace& ns, TMachineFiles const& files) { TStorageFill(ns, files).Run(); }

}  // namespace NQRVZEP20
