// SPDX-License-Identifier: Apache-2.0
#include "ExtentRecords.h"

#include "ValueNames.h"

#include <charconv>
#include <string>

namespace NQRVZEP20 {

namespace {

using TText = TFinding<std::string>;
using TCode = TFinding<unsigned short>;
using TNumber = TFinding<unsigned long>;

constexpr unsigned long kSysfsSector = 512;

// Values of the schema (ValueNames.h).
constexpr unsigned short kReadable = 1, kReadWrite = 3;
constexpr unsigned short kPrimary = 1, kExtended = 2, kLogical = 3;

// The directory with the request queue: a partition shares that of its disk.
std::string WholePath(TBlockDevice const& device) {
  return device.fKind == TBlockDevice::kPartition ? device.fPath.substr(0, device.fPath.rfind('/')) : device.fPath;
}

TNumber BlockSizeOf(TMachineFiles const& files, TBlockDevice const& device) {
  std::string const file = WholePath(device) + "/queue/logical_block_size";
  return files.Number<unsigned long>(file).Then([&](unsigned long size) -> TNumber {
    if (size == 0) return TMissing{kMissingUnexpected, file + " is 0"};
    return size;
  });
}

TNumber BlocksOf(TMachineFiles const& files, TBlockDevice const& device) {
  TNumber const blockSize = BlockSizeOf(files, device);
  if (!blockSize) return blockSize;
  return SizeOf(files, device).Then([&](unsigned long size) { return size / *blockSize; });
}

TCode AccessOf(TMachineFiles const& files, TBlockDevice const& device) {
  return files.Number<int>(device.File("ro")).Then([](int readOnly) { return readOnly != 0 ? kReadable : kReadWrite; });
}

// ---- Partitions ----

EPartitionTable TableFrom(TText const& scheme) {
  if (!scheme) return EPartitionTable::kOther;
  return *scheme == "gpt" ? EPartitionTable::kGpt : *scheme == "dos" ? EPartitionTable::kMbr : EPartitionTable::kOther;
}

// A value of the file "uevent" of sysfs: lines such as "PARTNAME=boot".
TText UeventValue(TMachineFiles const& files, TBlockDevice const& device, std::string const& name) {
  return files.Content(device.File("uevent")).Then([&](std::string const& content) -> TText {
    std::string const text = "\n" + content, wanted = "\n" + name + "=";
    std::size_t const found = text.find(wanted);
    if (found == text.npos) return TMissing{kMissingNotGiven, "the entry of the partition table has no name"};
    std::size_t const begin = found + wanted.size();
    return text.substr(begin, text.find('\n', begin) - begin);
  });
}

TText PartitionName(TMachineFiles const& files, TPartition const& partition) {
  if (partition.fTable == EPartitionTable::kMbr) return TMissing{kMissingNotApplicable, "partitions of an MBR have no names"};
  TText const name = partition.fUdev.DecodedValue("ID_PART_ENTRY_NAME");
  return name ? name : UeventValue(files, partition.fDevice, "PARTNAME");
}

TFinding<unsigned long> HexFrom(std::string const& text) {
  unsigned long number = 0;
  char const* const begin = text.data() + (text.compare(0, 2, "0x") == 0 ? 2 : 0);
  auto const [stop, error] = std::from_chars(begin, text.data() + text.size(), number, 16);
  if (error == std::errc() && stop == text.data() + text.size()) return number;
  return TMissing{kMissingUnexpected, "the udev database has \"" + text + "\", which is not a hexadecimal number"};
}

// Without flags in its entry a partition is not bootable.
TFinding<bool> BootableOf(TPartition const& partition) {
  constexpr unsigned long kMbrActive = 0x80, kGptLegacyBoot = 4;
  if (!partition.fUdev.Exists()) return partition.fUdev.Value("ID_PART_ENTRY_FLAGS").Why();
  TText const flags = partition.fUdev.Value("ID_PART_ENTRY_FLAGS");
  if (!flags) return false;
  unsigned long const mask = partition.fTable == EPartitionTable::kGpt ? kGptLegacyBoot : kMbrActive;
  return HexFrom(*flags).Then([&](unsigned long bits) { return (bits & mask) != 0; });
}

TNumber MbrTypeOf(TPartition const& partition) { return partition.fUdev.Value("ID_PART_ENTRY_TYPE").Then(HexFrom); }

TCode PartitionSubtypeFrom(unsigned long type) {
  for (TValueName const& known : kPartitionSubtypeNames)
    if (known.fValue == std::to_string(type)) return static_cast<unsigned short>(type);
  return TMissing{kMissingNotGiven, "the schema has no name for the partition type " + std::to_string(type)};
}

bool IsExtended(unsigned long type) { return type == 0x05 || type == 0x0f || type == 0x85; }

// The entries of an MBR have the numbers 1 to 4, the logical partitions in an extended one the numbers from 5.
TCode PartitionKindOf(TMachineFiles const& files, TPartition const& partition) {
  constexpr unsigned kLastPrimary = 4;
  auto const number = files.Number<unsigned>(partition.fDevice.File("partition"));
  if (!number) return number.Why();
  if (*number > kLastPrimary) return kLogical;
  return MbrTypeOf(partition).Then([](unsigned long type) { return IsExtended(type) ? kExtended : kPrimary; });
}

TRecord MbrRecord(TMachineFiles const& files, TPartition const& partition, TRecord record) {
  TCode const kind = PartitionKindOf(files, partition);
  record.Add("PrimaryPartition", kind.Then([](unsigned short code) { return code == kPrimary; }));
  record.Add("PartitionType", kind).Names(kPartitionTypeNames);
  record.Add("PartitionSubtype", MbrTypeOf(partition).Then(PartitionSubtypeFrom)).Names(kPartitionSubtypeNames);
  return record;
}

TRecord GptRecord(TPartition const& partition, TRecord record) {
  record.Add("PartitionType", partition.fUdev.Value("ID_PART_ENTRY_TYPE"));
  return record;
}

char const* ClassOf(EPartitionTable table) {
  if (table == EPartitionTable::kMbr) return "CIM_DiskPartition";
  return table == EPartitionTable::kGpt ? "CIM_GPTDiskPartition" : "CIM_GenericDiskPartition";
}

}  // namespace

TRecord ExtentRecord(char const* className, TMachineFiles const& files, TBlockDevice const& device, TComputerSystem const& system,
                     TText const& elementName, std::string const& superClass) {
  TRecord record(className, "sysfs, udev", superClass);
  system.AddDeviceKeys(record, device.fName);
  record.Add("Name", TText(device.Node()));
  record.Add("ElementName", elementName);
  record.Add("BlockSize", BlockSizeOf(files, device)).Unit("byte");
  record.Add("NumberOfBlocks", BlocksOf(files, device));
  record.Add("Access", AccessOf(files, device)).Names(kAccessNames);
  record.Add("Primordial", TFinding<bool>(device.IsDrive()));
  return record;
}

TPartition PartitionOf(TMachineFiles const& files, TBlockDevice const& device, TUdevRecord const& udev) {
  TPartition partition;
  partition.fDevice = device;
  partition.fUdev = udev;
  partition.fTable = TableFrom(udev.Value("ID_PART_ENTRY_SCHEME"));
  partition.fStart =
      files.Number<unsigned long>(device.File("start")).Then([](unsigned long sectors) { return sectors * kSysfsSector; });
  partition.fSize = SizeOf(files, device);
  return partition;
}

TRecord PartitionRecord(TMachineFiles const& files, TPartition const& partition, TComputerSystem const& system) {
  TRecord record = ExtentRecord(ClassOf(partition.fTable), files, partition.fDevice, system, PartitionName(files, partition));
  record.Add("Bootable", BootableOf(partition));
  record.Add("Signature", partition.fUdev.Value("ID_PART_ENTRY_UUID"));
  if (partition.fTable == EPartitionTable::kMbr) return MbrRecord(files, partition, record);
  if (partition.fTable == EPartitionTable::kGpt) return GptRecord(partition, record);
  return record;
}

TRecord BasedOnRecord(TNumber const& start, TNumber const& size, unsigned short order) {
  TRecord record("CIM_BasedOn", "sysfs");
  record.Add("StartingAddress", start).Unit("byte");
  record
      .Add("EndingAddress", size.Then([&](unsigned long length) -> TNumber {
        return start.Then([&](unsigned long begin) { return begin + length - 1; });
      }))
      .Unit("byte");
  record.Add("OrderIndex", TCode(order));
  return record;
}

}  // namespace NQRVZEP20
