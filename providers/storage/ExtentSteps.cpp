// SPDX-License-Identifier: Apache-2.0
#include "BlockDeviceRecords.h"
#include "ExtentRecords.h"
#include "TRaidArray.h"
#include "TStorage.h"
#include "VolumeRecords.h"

namespace NQRVZEP20 {

namespace {

constexpr TAssociation kMediaPresent{"CIM_MediaPresent", "Antecedent", "CIM_MediaAccessDevice", "Dependent", "CIM_StorageExtent"};
constexpr TAssociation kBasedOn{"CIM_BasedOn", "Antecedent", "CIM_StorageExtent", "Dependent", "CIM_StorageExtent"};
constexpr TAssociation kStatistics{"CIM_ElementStatisticalData", "ManagedElement", "CIM_ManagedElement", "Stats",
                                   "CIM_StatisticalData"};
constexpr TAssociation kSettings{"CIM_ElementSettingData", "ManagedElement", "CIM_ManagedElement", "SettingData",
                                 "CIM_SettingData"};

// Writes the extents of a class and keeps them by name.
void WriteExtentsOf(TStorage& storage, TRecord const& shape, std::vector<std::pair<std::string, TRecord>> const& extents,
                    char const* whyNone) {
  std::vector<TRecord> records;
  for (auto const& [name, record] : extents) {
    records.push_back(record);
    storage.fExtents.emplace(name, record);
  }
  storage.fWriter.Write(shape, records, {kMissingNotGiven, whyNone});
  for (TRecord const& record : records) storage.fWriter.Associate(kSystemDevice, storage.fSystemRecord, record);
}

// The extent of that device; null if the device has none.
TRecord const* ExtentOf(TStorage const& storage, std::string const& name) {
  auto const found = storage.fExtents.find(name);
  return found == storage.fExtents.end() ? nullptr : &found->second;
}

void BaseOn(TStorage& storage, std::string const& above, std::string const& below, TRecord const& place) {
  TRecord const *const lower = ExtentOf(storage, below), *const upper = ExtentOf(storage, above);
  if (lower != nullptr && upper != nullptr) storage.fWriter.Associate(kBasedOn, *lower, *upper, place);
}

// ---- Media, partitions, devices without hardware ----

TRecord MediumOf(TStorage const& storage, TDisk const& disk) {
  return ExtentRecord("CIM_StorageExtent", storage.fFiles, disk.fDevice, storage.fSystem, disk.fModel);
}

void WriteMedia(TStorage& storage) {
  std::vector<std::pair<std::string, TRecord>> media;
  for (TDisk const& disk : storage.fDisks)
    if (SizeOf(storage.fFiles, disk.fDevice)) media.emplace_back(disk.fDevice.fName, MediumOf(storage, disk));
  WriteExtentsOf(storage, MediumOf(storage, storage.fNoDisk), media, "no drive has a medium");
  for (auto const& [name, medium] : media) storage.fWriter.Associate(kMediaPresent, storage.fDrives.at(name), medium);
}

void WritePartitionsOf(TStorage& storage, std::vector<TPartition> const& partitions, EPartitionTable table, char const* whyNone) {
  TPartition shape;
  shape.fTable = table;
  std::vector<std::pair<std::string, TRecord>> records;
  for (TPartition const& partition : partitions)
    if (partition.fTable == table)
      records.emplace_back(partition.fDevice.fName, PartitionRecord(storage.fFiles, partition, storage.fSystem));
  WriteExtentsOf(storage, PartitionRecord(storage.fFiles, shape, storage.fSystem), records, whyNone);
}

std::vector<TPartition> WritePartitions(TStorage& storage) {
  std::vector<TPartition> partitions;
  for (TKnownDevice const& known : storage.fDevices)
    if (known.fDevice.fKind == TBlockDevice::kPartition)
      partitions.push_back(PartitionOf(storage.fFiles, known.fDevice, known.fUdev));
  WritePartitionsOf(storage, partitions, EPartitionTable::kOther, "no partition is in a table that is neither an MBR nor a GPT");
  WritePartitionsOf(storage, partitions, EPartitionTable::kMbr, "no partition is known to be in an MBR");
  WritePartitionsOf(storage, partitions, EPartitionTable::kGpt, "no partition is known to be in a GPT");
  return partitions;
}

// A loop device is known by its file.
TRecord OtherRecord(TStorage const& storage, TBlockDevice const& device) {
  auto const file = storage.fFiles.Line(device.File("loop/backing_file"));
  TMissing const noName{kMissingNotGiven, "the kernel has no other name for this device"};
  return ExtentRecord("CIM_LogicalDisk", storage.fFiles, device, storage.fSystem, file ? file : noName);
}

void WriteOthers(TStorage& storage) {
  std::vector<std::pair<std::string, TRecord>> records;
  for (TKnownDevice const& known : storage.fDevices)
    if (known.fDevice.fKind == TBlockDevice::kOther)
      records.emplace_back(known.fDevice.fName, OtherRecord(storage, known.fDevice));
  WriteExtentsOf(storage, OtherRecord(storage, TBlockDevice()), records,
                 "the kernel lists no device without hardware, such as a loop device that is set up");
}

// ---- Volumes ----

std::vector<TRaidArray> ArraysOf(TStorage const& storage) {
  std::vector<TRaidArray> arrays;
  for (TKnownDevice const& known : storage.fDevices)
    if (known.fDevice.fKind == TBlockDevice::kArray) arrays.push_back(RaidArrayOf(storage.fFiles, known.fDevice));
  return arrays;
}

TUdevRecord UdevOf(TStorage const& storage, std::string const& name) {
  for (TKnownDevice const& known : storage.fDevices)
    if (known.fDevice.fName == name) return known.fUdev;
  return TUdevRecord(TMissing());
}

void WriteArrays(TStorage& storage, std::vector<TRaidArray> const& arrays) {
  auto const recordOf = [&](TRaidArray const& array) {
    return RaidArrayRecord(storage.fFiles, array, UdevOf(storage, array.fDevice.fName), storage.fSystem);
  };
  std::vector<std::pair<std::string, TRecord>> records;
  for (TRaidArray const& array : arrays) records.emplace_back(array.fDevice.fName, recordOf(array));
  WriteExtentsOf(storage, recordOf(TRaidArray()), records, "the kernel runs no RAID array (MD)");
}

void WriteMembers(TStorage& storage, std::vector<TRaidArray> const& arrays) {
  TMissing const none{kMissingNotGiven, "the kernel runs no RAID array (MD)"};
  TRaidMember const shape{"", "", none, none, none, none, none};
  std::vector<TRaidMember> members;
  std::vector<TRecord> records;
  for (TRaidArray const& array : arrays) members.insert(members.end(), array.fMembers.begin(), array.fMembers.end());
  for (TRaidMember const& member : members) records.push_back(RaidMemberRecord(member));
  storage.fWriter.Write(RaidMemberRecord(shape), records, none);
  for (std::size_t i = 0; i < members.size(); ++i) {
    TRaidMember const& member = members[i];
    if (TRecord const* const extent = ExtentOf(storage, member.fDevice))
      storage.fWriter.Associate(kStatistics, *extent, records[i]);
    auto const order = static_cast<unsigned short>(member.fSlot ? *member.fSlot + 1 : 0);
    BaseOn(storage, member.fArray, member.fDevice, BasedOnRecord(member.fOffset, member.fSize, order));
  }
}

void WriteMapped(TStorage& storage) {
  std::vector<std::pair<std::string, TRecord>> records;
  for (TKnownDevice const& known : storage.fDevices)
    if (known.fDevice.fKind == TBlockDevice::kMapped)
      records.emplace_back(known.fDevice.fName, MappedVolumeRecord(storage.fFiles, known.fDevice, storage.fSystem));
  WriteExtentsOf(storage, MappedVolumeRecord(storage.fFiles, TBlockDevice(), storage.fSystem), records,
                 "the device mapper has no devices: there are no LVM volumes, encrypted devices or multipath devices");
}

// Devices of the device mapper and others, such as caches, only list the devices that they are made of.
void BaseOnDevicesBelow(TStorage& storage) {
  TMissing const noPlace{kMissingNotGiven, "sysfs lists the devices below this one, but not which parts of them it uses"};
  for (TKnownDevice const& known : storage.fDevices)
    if (known.fDevice.fKind == TBlockDevice::kMapped || known.fDevice.fKind == TBlockDevice::kOther)
      for (std::string const& below : DevicesBelow(storage.fFiles, known.fDevice))
        BaseOn(storage, known.fDevice.fName, below, BasedOnRecord(noPlace, noPlace));
}

}  // namespace

void WriteExtents(TStorage& storage) {
  WriteMedia(storage);
  std::vector<TPartition> const partitions = WritePartitions(storage);
  WriteOthers(storage);
  for (TPartition const& partition : partitions)
    BaseOn(storage, partition.fDevice.fName, partition.fDevice.fWhole, BasedOnRecord(partition.fStart, partition.fSize));
}

void WriteVolumes(TStorage& storage) {
  std::vector<TRaidArray> const arrays = ArraysOf(storage);
  WriteMapped(storage);
  WriteArrays(storage, arrays);
  WriteMembers(storage, arrays);
  BaseOnDevicesBelow(storage);
}

void WriteBlockDevices(TStorage& storage) {
  TMissing const whyNone{kMissingNotGiven, "the kernel lists no block devices in /sys/class/block"};
  TBlockDevice const shape;
  std::vector<TRecord> records, queues;
  std::vector<std::pair<std::string, TRecord>> settings;
  for (TKnownDevice const& known : storage.fDevices) {
    records.push_back(BlockDeviceRecord(storage.fFiles, known.fDevice, known.fUdev));
    settings.emplace_back(known.fDevice.fName, records.back());
    if (known.fDevice.fKind == TBlockDevice::kPartition) continue;
    queues.push_back(BlockQueueRecord(storage.fFiles, known.fDevice));
    settings.emplace_back(known.fDevice.fName, queues.back());
  }
  storage.fWriter.Write(BlockDeviceRecord(storage.fFiles, shape, TUdevRecord(TMissing())), records, whyNone);
  storage.fWriter.Write(BlockQueueRecord(storage.fFiles, shape), queues, whyNone);
  for (auto const& [name, record] : settings) {
    TRecord const* const extent = ExtentOf(storage, name);
    storage.fWriter.Associate(kSettings, extent != nullptr ? *extent : storage.fDrives.at(name), record);
  }
}

}  // namespace NQRVZEP20
