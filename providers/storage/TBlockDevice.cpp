// SPDX-License-Identifier: Apache-2.0
#include "TBlockDevice.h"

#include <algorithm>

namespace NQRVZEP20 {

namespace {

constexpr char const* kDirectory = "/sys/class/block";
constexpr char const* kTapeDirectory = "/sys/class/scsi_tape";
constexpr unsigned long kSysfsSector = 512;  // the unit of sizes in sysfs, whatever the sectors of the device are
constexpr int kScsiOptical = 5;              // a peripheral device type of the SCSI standard

bool BeginsWith(std::string const& text, char const* beginning) { return text.rfind(beginning, 0) == 0; }

std::string DirectoryAbove(std::string const& path) { return path.substr(0, path.rfind('/')); }
std::string LastName(std::string const& path) { return path.substr(path.rfind('/') + 1); }

TBlockDevice::EKind KindOf(TMachineFiles const& files, TBlockDevice const& device) {
  if (files.Exists(device.File("partition"))) return TBlockDevice::kPartition;
  if (files.Exists(device.File("md"))) return TBlockDevice::kArray;
  if (files.Exists(device.File("dm"))) return TBlockDevice::kMapped;
  bool const isPartOfCard = files.Exists(DirectoryAbove(device.fPath) + "/queue");
  if (isPartOfCard || !files.Exists(device.File("device"))) return TBlockDevice::kOther;
  if (BeginsWith(device.fName, "fd")) return TBlockDevice::kDiskette;
  TFinding<int> const scsiType = files.Number<int>(device.File("device/type"));
  return scsiType && *scsiType == kScsiOptical ? TBlockDevice::kOptical : TBlockDevice::kDisk;
}

// The sizes that the kernel assumes as long as no program has opened the drive.
bool IsAssumed(TBlockDevice::EKind kind, unsigned long sectors) {
  constexpr unsigned long kDisketteSectors = 8, kOpticalSectors = 0x1fffff;
  return (kind == TBlockDevice::kDiskette && sectors == kDisketteSectors) ||
         (kind == TBlockDevice::kOptical && sectors == kOpticalSectors);
}

bool IsSetUp(TMachineFiles const& files, TBlockDevice const& device) {
  if (device.fKind == TBlockDevice::kArray) {
    auto const state = files.Line(device.File("md/array_state"));
    return !state || *state != "clear";
  }
  bool const canLackMedium = device.IsDrive() || device.fKind == TBlockDevice::kPartition;
  return canLackMedium || SizeOf(files, device);
}

bool IsHidden(TMachineFiles const& files, TBlockDevice const& device) {
  auto const hidden = files.Number<int>(device.File("hidden"));
  return hidden && *hidden != 0;
}

}  // namespace

std::string TBlockDevice::Node() const {
  std::string node = "/dev/" + fName;
  std::replace(node.begin(), node.end(), '!', '/');  // sysfs names /dev/cciss/c0d0 "cciss!c0d0"
  return node;
}

std::vector<TBlockDevice> BlockDevicesOf(TMachineFiles const& files) {
  std::vector<TBlockDevice> devices;
  for (std::string const& name : files.Names(kDirectory)) {
    auto const path = files.RealPath(std::string(kDirectory) + "/" + name);
    if (!path) continue;
    TBlockDevice device;
    device.fName = name;
    device.fPath = *path;
    device.fKind = KindOf(files, device);
    if (device.fKind == TBlockDevice::kPartition) device.fWhole = LastName(DirectoryAbove(device.fPath));
    if (!IsHidden(files, device) && IsSetUp(files, device)) devices.push_back(device);
  }
  return devices;
}

// Each drive has several names, for its densities and for rewinding; "st0" is the first.
std::vector<TBlockDevice> TapeDrivesOf(TMachineFiles const& files) {
  std::vector<TBlockDevice> drives;
  for (std::string const& name : files.Names(kTapeDirectory)) {
    bool const isFirstName = BeginsWith(name, "st") && name.find_first_not_of("0123456789", 2) == name.npos;
    auto const path = files.RealPath(std::string(kTapeDirectory) + "/" + name);
    if (isFirstName && path) drives.push_back({name, *path, TBlockDevice::kTape});
  }
  return drives;
}

TFinding<unsigned long> SizeOf(TMachineFiles const& files, TBlockDevice const& device) {
  std::string const file = device.File("size");
  return files.Number<unsigned long>(file).Then([&](unsigned long sectors) -> TFinding<unsigned long> {
    if (sectors == 0) return TMissing{kMissingNotGiven, file + " is 0: the drive has no medium"};
    if (IsAssumed(device.fKind, sectors))
      return TMissing{
          kMissingNotGiven,
          "the kernel does not know the size of the medium, and whether there is one, before a program opens the drive"};
    return sectors * kSysfsSector;
  });
}

TFinding<std::string> NumberOf(TMachineFiles const& files, TBlockDevice const& device) { return files.Line(device.File("dev")); }

}  // namespace NQRVZEP20
