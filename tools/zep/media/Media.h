// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <cstdint>
#include <optional>
#include <string>
#include <vector>

namespace NQRVZEP20::zep {

// ---- Names ----

// Whether a name is safe to pass to the library, which inserts it into a shell command verbatim. Such a name is an absolute path
// that consists of letters, digits, "/", "-", "_" and ".", and has no component "." or "..".
bool IsPlainPath(std::string const& name);

// "/mnt/key" for "/mnt/key/"; "/" is returned unchanged.
std::string WithoutTrailingSlashes(std::string name);

// Throws TWrongUsage for a name that is not a plain path below /dev, and std::runtime_error for a device that does not exist.
void CheckDevice(std::string const& device);

// ---- Media and mounts ----

// A removable medium, or a partition of one, that can hold a file system.
struct TMedium {
  std::string fDevice;       // "/dev/sdb1"
  std::string fDescription;  // vendor and product; may be empty, like the label and the file system
  std::string fLabel, fFileSystem;
  std::uint64_t fSize;  // in bytes
  bool fIsReadOnly;
  std::vector<std::string> fMountPoints;  // includes those of its encrypted and logical volumes; empty when it is not mounted
  bool fIsOptical;
};

// Returns the media in disks and drives that are removable or connected by USB, from the output of "lsblk --json". Throws
// std::runtime_error if the output has another format.
std::vector<TMedium> MediaIn(std::string const& lsblkOutput);

// Sets the label and the file system of the medium from the output of "blkid -o export".
void ReadLabel(std::string const& blkidOutput, TMedium& medium);

// The media of this machine.
std::vector<TMedium> FindMedia();

// Whether this user can see labels and file systems. Root can read them from the devices; if udev is running, every user can
// get them from it.
bool AreLabelsReadable();

struct TMount {
  std::string fMountPoint;
  std::string fSource;  // "/dev/sdb1"
  std::uint64_t fDevice;
  bool fIsReadOnly;
};

// All mounts, in the order of /proc/self/mountinfo.
std::vector<TMount> MountsIn(std::string const& mountInfo);
std::vector<TMount> Mounts();

// The mount whose mount point is exactly `directory`; if there are several, the topmost.
std::optional<TMount> MountIn(std::string const& mountInfo, std::string const& directory);
std::optional<TMount> MountAt(std::string const& directory);

}  // namespace NQRVZEP20::zep
