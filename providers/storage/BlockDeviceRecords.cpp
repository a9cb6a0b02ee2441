// SPDX-License-Identifier: Apache-2.0
#include "BlockDeviceRecords.h"

#include <algorithm>
#include <cctype>
#include <iterator>

namespace NQRVZEP20 {

namespace {

using TText = TFinding<std::string>;
using TNumber = TFinding<unsigned long>;

constexpr unsigned long kSysfsSector = 512;
constexpr unsigned long kKiB = 1024;

// "crypt" for the identifier "CRYPT-LUKS2-...", "part" for "part1-mpath-...".
TText MappedTypeFrom(std::string const& uuid) {
  std::string type = uuid.substr(0, uuid.find('-'));
  std::transform(type.begin(), type.end(), type.begin(), [](unsigned char c) { return static_cast<char>(std::tolower(c)); });
  if (type.rfind("part", 0) == 0) return std::string("part");
  return type;
}

TText MappedType(TMachineFiles const& files, TBlockDevice const& device) {
  TText const type = files.Line(device.File("dm/uuid")).Then(MappedTypeFrom);
  return type ? type : TText("dm");
}

// The letters before the number: "loop" for "loop0".
std::string OtherType(TBlockDevice const& device) { return device.fName.substr(0, device.fName.find_first_of("0123456789")); }

TNumber Sectors(TMachineFiles const& files, TBlockDevice const& device, char const* file) {
  return files.Number<unsigned long>(device.File(file)).Then([](unsigned long sectors) { return sectors * kSysfsSector; });
}

TFinding<bool> Flag(TMachineFiles const& files, TBlockDevice const& device, char const* file) {
  return files.Number<int>(device.File(file)).Then([](int number) { return number != 0; });
}

TNumber Bytes(TMachineFiles const& files, TBlockDevice const& device, std::string const& file) {
  return files.Number<unsigned long>(device.File("queue/" + file));
}

// The scheduler in brackets: "mq-deadline" for "none [mq-deadline]".
TText SchedulerFrom(std::string const& text) {
  std::size_t const open = text.find('['), close = text.find(']');
  if (open == text.npos || close == text.npos || close < open) return text;
  return text.substr(open + 1, close - open - 1);
}

// The kernel states -1 for a device that places its data as it pleases.
TFinding<long> AlignmentOf(TMachineFiles const& files, TBlockDevice const& device, char const* file) {
  return files.Number<long>(device.File(file)).Then([&](long offset) -> TFinding<long> {
    if (offset < 0) return TMissing{kMissingNotGiven, device.File(file) + " is -1: the device is misaligned"};
    return offset;
  });
}

TNumber OptimalSize(TMachineFiles const& files, TBlockDevice const& device) {
  return Bytes(files, device, "optimal_io_size").Then([](unsigned long size) -> TNumber {
    if (size == 0) return TMissing{kMissingNotGiven, "the device reports no optimal size"};
    return size;
  });
}

template <class T>
TFinding<T> IfZoned(TMachineFiles const& files, TBlockDevice const& device, TFinding<T> const& value) {
  TText const zoned = files.Line(device.File("queue/zoned"));
  if (zoned && *zoned == "none") return TMissing{kMissingNotApplicable, "the device has no zones"};
  return value;
}

TText PartitionValue(TBlockDevice const& device, TUdevRecord const& udev, char const* name) {
  if (device.fKind != TBlockDevice::kPartition) return TMissing{kMissingNotApplicable, "this device is not a partition"};
  return udev.Value(name);
}

}  // namespace

TText TypeOf(TMachineFiles const& files, TBlockDevice const& device) {
  switch (device.fKind) {
    case TBlockDevice::kDisk:
    case TBlockDevice::kDiskette:
      return std::string("disk");
    case TBlockDevice::kOptical:
      return std::string("rom");
    case TBlockDevice::kTape:
      return std::string("tape");
    case TBlockDevice::kPartition:
      return std::string("part");
    case TBlockDevice::kArray:
      return files.Line(device.File("md/level"));
    case TBlockDevice::kMapped:
      return MappedType(files, device);
    default:
      return OtherType(device);
  }
}

TRecord BlockDeviceRecord(TMachineFiles const& files, TBlockDevice const& device, TUdevRecord const& udev) {
  TRecord record("ZEP_BlockDevice", "sysfs", "CIM_SettingData");
  record.AddKey("InstanceID", "ZEP:block:" + device.fName);
  record.Add("ElementName", TText(device.fName));
  record.Add("Type", TypeOf(files, device));
  record.Add("Node", TText(device.Node()));
  record.Add("Number", NumberOf(files, device));
  record.Add("Size", SizeOf(files, device)).Unit("byte");
  record.Add("ReadOnly", Flag(files, device, "ro"));
  record.Add("AlignmentOffset", AlignmentOf(files, device, "alignment_offset")).Unit("byte");
  record.Add("DiscardAlignment", AlignmentOf(files, device, "discard_alignment")).Unit("byte");
  record.SetSource("udev");
  record.Add("Links", udev.Links());
  record.Add("ContentUse", udev.Value("ID_FS_USAGE"));
  record.Add("ContentType", udev.Value("ID_FS_TYPE"));
  record.Add("ContentVersion", udev.Value("ID_FS_VERSION"));
  record.Add("ContentLabel", udev.DecodedValue("ID_FS_LABEL_ENC"));
  record.Add("ContentUUID", udev.DecodedValue("ID_FS_UUID_ENC"));
  record.Add("TableType", udev.Value("ID_PART_TABLE_TYPE"));
  record.Add("TableUUID", udev.Value("ID_PART_TABLE_UUID"));
  record.Add("EntryType", PartitionValue(device, udev, "ID_PART_ENTRY_TYPE"));
  record.Add("EntryFlags", PartitionValue(device, udev, "ID_PART_ENTRY_FLAGS"));
  return record;
}

TRecord BlockQueueRecord(TMachineFiles const& files, TBlockDevice const& device) {
  TRecord record("ZEP_BlockQueue", "sysfs", "CIM_SettingData");
  record.AddKey("InstanceID", "ZEP:queue:" + device.fName);
  record.Add("ElementName", TText(device.fName));
  record.Add("LogicalBlockSize", Bytes(files, device, "logical_block_size")).Unit("byte");
  record.Add("PhysicalBlockSize", Bytes(files, device, "physical_block_size")).Unit("byte");
  record.Add("MinimumIOSize", Bytes(files, device, "minimum_io_size")).Unit("byte");
  record.Add("OptimalIOSize", OptimalSize(files, device)).Unit("byte");
  record.Add("ReadAhead", Bytes(files, device, "read_ahead_kb").Then([](unsigned long size) { return size * kKiB; }))
      .Unit("byte");
  record.Add("Scheduler", files.Line(device.File("queue/scheduler")).Then(SchedulerFrom));
  record.Add("Requests", files.Number<unsigned int>(device.File("queue/nr_requests")));
  record.Add("WriteCache", files.Line(device.File("queue/write_cache")));
  record.Add("Rotational", Flag(files, device, "queue/rotational"));
  record.Add("Removable", Flag(files, device, "removable"));
  record.Add("AddsRandomness", Flag(files, device, "queue/add_random"));
  record.Add("DirectAccess", Flag(files, device, "queue/dax"));
  record.Add("DiscardGranularity", Bytes(files, device, "discard_granularity")).Unit("byte");
  record.Add("DiscardMaximum", Bytes(files, device, "discard_max_bytes")).Unit("byte");
  record.Add("DiscardZeroes", Flag(files, device, "queue/discard_zeroes_data"));
  record.Add("WriteSameMaximum", Bytes(files, device, "write_same_max_bytes")).Unit("byte");
  record.Add("Zoned", files.Line(device.File("queue/zoned")));
  record.Add("ZoneSize", IfZoned(files, device, Sectors(files, device, "queue/chunk_sectors"))).Unit("byte");
  record.Add("Zones", IfZoned(files, device, files.Number<unsigned int>(device.File("queue/nr_zones"))));
  return record;
}

}  // namespace NQRVZEP20
