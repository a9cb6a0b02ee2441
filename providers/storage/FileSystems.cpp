// SPDX-License-Identifier: Apache-2.0
#include "FileSystems.h"

#include <algorithm>
#include <iterator>
#include <set>

namespace NQRVZEP20 {

namespace {

// File systems without storage of their own.
constexpr char const* kKernelTypes[] = {
    "autofs",   "binder",          "binfmt_misc", "bpf",         "cgroup",     "cgroup2",   "configfs", "debugfs", "devpts",
    "efivarfs", "fuse.gvfsd-fuse", "fuse.lxcfs",  "fuse.portal", "fusectl",    "hugetlbfs", "mqueue",   "nfsd",    "nsfs",
    "proc",     "pstore",          "resctrl",     "rpc_pipefs",  "securityfs", "selinuxfs", "smackfs",  "sysfs",   "tracefs"};
constexpr char const* kMemoryTypes[] = {"aufs", "devtmpfs", "overlay", "ramfs", "rootfs", "tmpfs", "unionfs"};
// These have a device or several, but the number of their mounts is not that of a device.
constexpr char const* kTypesWithOwnNumbers[] = {"bcachefs", "btrfs", "zfs"};

template <std::size_t N>
bool IsOneOf(std::string const& type, char const* const (&types)[N]) {
  return std::find_if(std::begin(types), std::end(types), [&](char const* known) { return type == known; }) != std::end(types);
}

bool IsWithoutDevice(TMount const& mount) { return mount.fNumber.rfind("0:", 0) == 0; }

TFileSystem::EPlace PlaceOf(TMount const& mount) {
  if (IsOneOf(mount.fType, kMemoryTypes)) return TFileSystem::kInMemory;
  if (mount.fType == "fuseblk") return TFileSystem::kElsewhere;
  return IsWithoutDevice(mount) && !IsOneOf(mount.fType, kTypesWithOwnNumbers) ? TFileSystem::kElsewhere : TFileSystem::kOnDevice;
}

// Finds the device of a mount: by its number, or for a file system with numbers of its own by the node or a link to it.
class TDeviceIndex {
public:
  explicit TDeviceIndex(std::vector<TKnownDevice> const& devices) {
    for (TKnownDevice const& device : devices) {
      if (device.fNumber) fByText.emplace(*device.fNumber, &device);
      fByText.emplace(device.fDevice.Node(), &device);
      auto const links = device.fUdev.Links();
      if (links)
        for (std::string const& link : *links) fByText.emplace(link, &device);
    }
  }

  TKnownDevice const* Find(TMount const& mount) const {
    auto const found = fByText.find(IsWithoutDevice(mount) ? mount.fSource : mount.fNumber);
    return found == fByText.end() ? nullptr : found->second;
  }

private:
  std::map<std::string, TKnownDevice const*> fByText;
};

TFileSystem FileSystemOf(TMount const& mount, TKnownDevice const* device) {
  TFileSystem system;
  system.fType = mount.fType;
  system.fPlace = PlaceOf(mount);
  system.fLabel = system.fPlace == TFileSystem::kOnDevice
                      ? TMissing{kMissingNotGiven, "the device of this file system is not listed in /sys/class/block"}
                      : TMissing{kMissingNotApplicable, "a file system of this type has no label"};
  bool const hasNode = mount.fSource.rfind("/dev/", 0) == 0;
  system.fName = hasNode ? mount.fSource : mount.fSource + " on " + mount.fMountPoint;
  if (device == nullptr) return system;
  system.fName = device->fDevice.Node();
  system.fDevice = device->fDevice.fName;
  system.fLabel = device->fUdev.DecodedValue("ID_FS_LABEL_ENC");
  return system;
}

// Adds a mount to the file system of the same device and type, or as a new one.
void AddMount(TMount const& mount, TKnownDevice const* device, std::vector<TFileSystem>& systems) {
  auto const isSame = [&](TFileSystem const& system) {
    return !system.fMounts.empty() && system.fMounts[0].fNumber == mount.fNumber && system.fType == mount.fType;
  };
  auto found = std::find_if(systems.begin(), systems.end(), isSame);
  if (found == systems.end()) found = systems.insert(systems.end(), FileSystemOf(mount, device));
  bool const isWhole = mount.fRoot == "/";
  bool const isBetterFirst = isWhole && !found->fMounts.empty() && found->fMounts[0].fRoot != "/";
  found->fMounts.insert(isBetterFirst ? found->fMounts.begin() : found->fMounts.end(), mount);
}

// Adds a file system that udev found on a device, unless it is mounted.
void AddUnmounted(TKnownDevice const& device, std::vector<TFileSystem>& systems) {
  auto const usage = device.fUdev.Value("ID_FS_USAGE"), type = device.fUdev.Value("ID_FS_TYPE");
  if (!usage || *usage != "filesystem" || !type) return;
  auto const isSame = [&](TFileSystem const& system) { return system.fDevice == device.fDevice.fName; };
  if (std::any_of(systems.begin(), systems.end(), isSame)) return;
  TFileSystem system;
  system.fName = device.fDevice.Node();
  system.fDevice = device.fDevice.fName;
  system.fType = *type;
  system.fLabel = device.fUdev.DecodedValue("ID_FS_LABEL_ENC");
  systems.push_back(system);
}

// Marks a file system whose first mount point is hidden by a later mount.
void MarkCovered(std::vector<TMount> const& mounts, TFileSystem& system) {
  if (system.fMounts.empty()) return;
  TMount const& first = system.fMounts[0];
  auto const last =
      std::find_if(mounts.rbegin(), mounts.rend(), [&](TMount const& mount) { return mount.fMountPoint == first.fMountPoint; });
  system.fIsCovered = last->fId != first.fId;
}

// Names are keys: further file systems of the same name are numbered.
void MakeNamesUnique(std::vector<TFileSystem>& systems) {
  std::set<std::string> names;
  for (TFileSystem& system : systems) {
    std::string const name = system.fName;
    for (int number = 2; !names.insert(system.fName).second; ++number) system.fName = name + " (" + std::to_string(number) + ")";
  }
}

}  // namespace

std::vector<TFileSystem> FileSystemsOf(std::vector<TMount> const& mounts, std::vector<TKnownDevice> const& devices) {
  TDeviceIndex const index(devices);
  std::vector<TFileSystem> systems;
  for (TMount const& mount : mounts)
    if (!IsOneOf(mount.fType, kKernelTypes)) AddMount(mount, index.Find(mount), systems);
  for (TFileSystem& system : systems) MarkCovered(mounts, system);
  for (TKnownDevice const& device : devices) AddUnmounted(device, systems);
  MakeNamesUnique(systems);
  return systems;
}

}  // namespace NQRVZEP20
