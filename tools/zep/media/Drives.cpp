// SPDX-License-Identifier: Apache-2.0
#include "tools/zep/media/Drives.h"

#include <sys/stat.h>
#include <sys/sysmacros.h>

#include <algorithm>
#include <filesystem>

namespace NQRVZEP20::zep {

namespace {

namespace fs = std::filesystem;

std::string TextOf(std::uint64_t number) {
  return std::to_string(::gnu_dev_major(number)) + ":" + std::to_string(::gnu_dev_minor(number));
}

// The path of a block device in sysfs; empty when it has none.
fs::path PlaceOf(std::uint64_t number) {
  std::error_code error;
  return fs::canonical("/sys/dev/block/" + TextOf(number), error);
}

bool IsPartitionDirectory(fs::path const& place) {
  std::error_code error;
  return !place.empty() && fs::exists(place / "partition", error);
}

// The directory "slaves" of a volume lists the devices of which the volume consists.
void AddDrivesOf(fs::path const& place, TDrives& drives) {
  if (place.empty()) return;
  std::error_code error;
  bool isVolume = false;
  for (fs::directory_iterator slave(place / "slaves", error), end; slave != end; slave.increment(error)) {
    isVolume = true;
    AddDrivesOf(fs::canonical(slave->path(), error), drives);
  }
  if (!isVolume) drives.insert(IsPartitionDirectory(place) ? place.parent_path() : place);
}

void AddDrivesOf(std::uint64_t number, TDrives& drives) {
  fs::path const place = PlaceOf(number);
  if (!place.empty())
    AddDrivesOf(place, drives);
  else if (number != 0)
    drives.insert(TextOf(number));
}

}  // namespace

std::uint64_t NumberOf(std::string const& path) {
  struct stat status;
  return ::stat(path.c_str(), &status) == 0 && S_ISBLK(status.st_mode) ? status.st_rdev : 0;
}

bool IsPartitionOf(std::string const& partition, std::string const& device) {
  fs::path const place = PlaceOf(NumberOf(partition));
  return IsPartitionDirectory(place) && place.parent_path() == PlaceOf(NumberOf(device));
}

TDrives DrivesOf(TMount const& mount) {
  TDrives drives;
  AddDrivesOf(mount.fDevice, drives);
  // Some file systems have device numbers of their own, so the source is added as well. A source that is not a device may be on
  // an unreachable server, so it is not accessed.
  if (mount.fSource.rfind("/dev/", 0) == 0) AddDrivesOf(NumberOf(mount.fSource), drives);
  return drives;
}

std::vector<std::string> MountPointsOf(TDrives const& drives) {
  std::vector<std::string> mountPoints;
  for (TMount const& mount : Mounts()) {
    TDrives const own = DrivesOf(mount);
    bool const isOnDrive =
        std::any_of(own.begin(), own.end(), [&](std::string const& drive) { return drives.count(drive) != 0; });
    bool const isNew = std::find(mountPoints.begin(), mountPoints.end(), mount.fMountPoint) == mountPoints.end();
    if (isOnDrive && isNew) mountPoints.push_back(mount.fMountPoint);
  }
  return mountPoints;
}

}  // namespace NQRVZEP20::zep
