// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <cstdint>
#include <optional>
#include <string>
#include <vector>

namespace NQRVZEP20::zep {

// ---- Names ----

// Whether a name can be handed to the library, which puts it into a command of the shell as it is: only letters, digits,
// "/", "-", "_" and ".", an absolute path, and none of its parts "." or "..".
bool IsPlainPath(std::string const& name);

// "/mnt/key" for "/mnt/key/"; "/" stays.
std::string WithoutTrailingSlashes(std::string name);

// Throws TWrongUsage for a name that is no plain path below /dev, std::runtime_error for a device that is not there.
void CheckDevice(std::string const& device);

// ---- What is there ----

// A removable medium, or a partition of one, that can hold a file system.
struct TMedium {
  std::string fDevice;       // "/dev/sdb1"
  std::string fDescription;  // maker and product; may be empty, as the next two
  std::string fLabel, fFileSystem;
  std::uint64_t fSize;  // in bytes
  bool fIsReadOnly;
  std::vector<std::string> fMountPoints;  // also those of the encrypted and logical volumes on it; none when it is not mounted
  bool fIsOptical;
};

// The media that the output of "lsblk --json" shows, of disks and drives that are removable or on the USB. Throws
// std::runtime_error for what is no such output.
std::vector<TMedium> MediaIn(std::string const& lsblkOutput);

// Label and file system in the output of "blkid -o export".
void ReadLabel(std::string const& blkidOutput, TMedium& medium);

// Those of this machine.
std::vector<TMedium> FindMedia();

// Labels and file systems are read by root, or by udev for everyone.
bool AreLabelsReadable();

struct TMount {
  std::string fMountPoint;
  std::string fSource;  // "/dev/sdb1"
  std::uint64_t fDevice;
  bool fIsReadOnly;
};

// Everything that is mounted, as /proc/self/mountinfo has it.
std::vector<TMount> MountsIn(std::string const& mountInfo);
std::vector<TMount> Mounts();

// What is mounted at exactly that directory, the topmost where there are several.
std::optional<TMount> MountIn(std::string const& mountInfo, std::string const& directory);
std::optional<TMount> MountAt(std::string const& directory);

}  // namespace NQRVZEP20::zep
