// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <cstdint>
#include <optional>
#include <string>
#include <vector>

namespace NQRVZEP20::zep {

// ---- Names ----

// Whether a name can be passed to the library, which inserts it into a shell command verbatim: an absolute path of letters,
// digits,
// "/", "-", "_" and ".", without the parts "." and "..".
bool IsPlainPath(std::string const& name);

// "/mnt/key" for "/mnt/key/"; "/" stays.
std::string WithoutTrailingSlashes(std::string name);

// Throws TWrongUsage for a name that is not a plain path below /dev, std::runtime_error for a device that does not exist.
void CheckDevice(std::string const& device);

// ---- Media and mounts ----

// A removable medium, or a partition of one, that can hold a file system.
struct TMedium {
  std::string fDevice;       // "/dev/sdb1"
  std::string fDescription;  // maker and product; may be empty, as the next two
  std::string fLabel, fFileSystem;
  std::uint64_t fSize;  // in bytes
  bool fIsReadOnly;
  std::vector<std::string> fMountPoints;  // of its encrypted and logical volumes, too; none when it is not mounted
  bool fIsOptical;
};

// The media in the output of "lsblk --json", of disks and drives that are removable or connected by USB. Throws
// std::runtime_error for any other output.
std::vector<TMedium> MediaIn(std::string const& lsblkOutput);

// Label and file system in the output of "blkid -o export".
void ReadLabel(std::string const& blkidOutput, TMedium& medium);

// The media of this machine.
std::vector<TMedium> FindMedia();

// Whether this user can see labels and file systems: root reads them, and udev publishes them for everyone.
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

// The mount at exactly that directory; the topmost when there are several.
std::optional<TMount> MountIn(std::string const& mountInfo, std::string const& directory);
std::optional<TMount> MountAt(std::string const& directory);

}  // namespace NQRVZEP20::zep
