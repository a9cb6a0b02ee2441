// SPDX-License-Identifier: Apache-2.0
#include "tools/zep/media/TMountedMedium.h"

#include "TOSSpecific.h"
#include "TZEPException.h"
#include "core/Handles.h"
#include "os/MediaTexts.h"
#include "tools/zep/media/Drives.h"
#include "tools/zep/output/Failure.h"
#include "tools/zep/output/Text.h"
#include "tools/zep/processes/Interrupts.h"
#include "tools/zep/processes/WriteWhole.h"

#include <fcntl.h>
#include <unistd.h>

#include <cerrno>
#include <cstdio>
#include <cstdlib>
#include <sstream>
#include <stdexcept>
#include <system_error>

namespace NQRVZEP20::zep {

namespace {

TUniqueFd Open(int directory, std::string const& name, int flags) {
  return TUniqueFd(::openat(directory, name.c_str(), flags | O_CLOEXEC, 0644));
}

[[noreturn]] void Throw(std::string const& what) { throw std::runtime_error(what); }

void ThrowIf(bool hasFailed, std::string const& what) {
  if (hasFailed) throw std::runtime_error(what + ": " + std::generic_category().message(errno));
}

// ---- Mounting ----

// The device that the library tries to mount when the device itself cannot be mounted.
std::string FirstPartitionOf(std::string const& device) { return device + "1"; }

// Some file systems have device numbers of their own, so the source is compared as well.
bool IsMountOf(std::string const& node, TMount const& mount) {
  std::uint64_t const number = NumberOf(node);
  return number != 0 && (number == mount.fDevice || number == NumberOf(mount.fSource));
}

// Whether the mount is a mount of the device or of its first partition.
bool IsOf(TMount const& mount, std::string const& device) {
  std::string const partition = FirstPartitionOf(device);
  return IsMountOf(device, mount) || (IsMountOf(partition, mount) && IsPartitionOf(partition, device));
}

void RefuseOther(std::optional<TMount> const& mount, std::string const& mountPoint, std::string const& device) {
  if (mount && !IsOf(*mount, device)) Throw(mount->fSource + " is already mounted at " + mountPoint + "; unmount it first");
}

// The library would also try the device whose name ends in one more "1", but "/dev/sdb11" is not a partition of "/dev/sdb1".
void RefuseForeignPartition(std::string const& device) {
  std::string const next = FirstPartitionOf(device);
  if (NumberOf(next) != 0 && !IsPartitionOf(next, device))
    Throw(device + " was not mounted: mounting it would also try " + next + ", which is not a partition of " + device);
}

// The library runs the program through the shell, where a missing program cannot be distinguished from an unreadable medium.
void NeedProgram(std::string const& name) {
  char const* const path = std::getenv("PATH");
  std::istringstream directories(path != nullptr ? path : "");
  for (std::string directory; std::getline(directories, directory, ':');)
    if (::access((directory + "/" + name).c_str(), X_OK) == 0) return;
  Throw("the program " + name + " is missing; install the package mount");
}

TMount MountOrThrow(std::string const& device, std::string const& mountPoint) {
  std::optional<TMount> const present = MountAt(mountPoint);
  RefuseOther(present, mountPoint, device);
  if (!present) RefuseForeignPartition(device);
  if (!TOSSpecific::IsAdmin()) Throw("only root can mount " + device);
  NeedProgram("mount");
  try {
    if (!TOSSpecific::DirExists(mountPoint)) TOSSpecific::CreateDir(mountPoint);
  } catch (TZEPException const& failure) {
    Throw("the directory " + mountPoint + " cannot be created: " + failure.what());
  }
  try {
    TInterruptsBlocked const blocked;
    TOSSpecific::MountDevice(device);
  } catch (TZEPException const&) {
    Throw(device + " cannot be mounted: neither it nor " + FirstPartitionOf(device) + " has a readable file system");
  }
  std::optional<TMount> const mount = MountAt(mountPoint);
  if (!mount)
    Throw(device + " was not mounted, because the path of another mount point ends in " + mountPoint + "; unmount that first");
  RefuseOther(mount, mountPoint, device);
  return *mount;
}

// Accepts only directories where media are mounted, so that a mistyped name does not unmount another file system.
void CheckDirectory(std::string const& directory) {
  auto const isBelow = [&](char const* place) { return directory.rfind(place, 0) == 0; };
  if (IsPlainPath(directory) && (isBelow("/mnt/") || isBelow("/media/") || isBelow("/run/media/"))) return;
  throw TWrongUsage("\"" + directory +
                    "\" is not a mount point of a medium: it must be a path below /mnt, /media or /run/media of letters, " +
                    "digits, \"/\", \"-\", \"_\" and \".\"");
}

// ---- Writing ----

// Renames a file unless a file of the new name exists. Some file systems in user space cannot check this themselves.
void RenameToNew(int directory, std::string const& from, std::string const& to, std::string const& what) {
  if (::renameat2(directory, from.c_str(), directory, to.c_str(), RENAME_NOREPLACE) == 0) return;
  ThrowIf(errno != EINVAL && errno != ENOSYS, what);
  if (::faccessat(directory, to.c_str(), F_OK, AT_SYMLINK_NOFOLLOW) == 0) errno = EEXIST;
  ThrowIf(errno != ENOENT || ::renameat(directory, from.c_str(), directory, to.c_str()) != 0, what);
}

// Some file systems cannot sync a directory, so the complete file system is synced as well.
void SyncDirectory(int directory, std::string const& what) {
  ThrowIf(::fsync(directory) != 0 && errno != EINVAL, what);
  ThrowIf(::syncfs(directory) != 0, what);
}

}  // namespace

TMountedMedium::TMountedMedium(std::string const& device) {
  CheckDevice(device);
  fMountPoint = MountPointOf(device);
  fMount = MountOrThrow(device, fMountPoint);
}

void TMountedMedium::Write(std::string const& name, std::string const& contents) const {
  std::string const what = name + " cannot be written to " + Device();
  ThrowIfInterrupted(what);
  if (fMount.fIsReadOnly) Throw(what + ": the medium is read-only");
  TUniqueFd const directory = Open(AT_FDCWD, fMountPoint, O_RDONLY | O_DIRECTORY);
  ThrowIf(!directory, what);

  // The file has another name until it is complete, so that a medium that is pulled out never has an incomplete file under the
  // final name.
  std::string const draft = name + ".part";
  std::string present = draft;
  TUniqueFd const file = Open(directory.get(), draft, O_WRONLY | O_CREAT | O_EXCL | O_NOFOLLOW);
  ThrowIf(!file, what);
  try {
    ThrowIf(!WriteWhole(file.get(), contents), what);
    ThrowIf(::fsync(file.get()) != 0, what);
    ThrowIfInterrupted(what);
    RenameToNew(directory.get(), draft, name, what);
    present = name;
    SyncDirectory(directory.get(), what);
  } catch (std::runtime_error const&) {
    ::unlinkat(directory.get(), present.c_str(), 0);
    throw;
  }
}

std::vector<std::string> UnmountDirectory(std::string const& directory) {
  CheckDirectory(directory);
  std::optional<TMount> const mount = MountAt(directory);
  if (!mount) Throw("nothing is mounted at " + directory);
  if (!TOSSpecific::IsAdmin()) Throw("only root can unmount " + directory);
  NeedProgram("umount");

  TDrives const drives = DrivesOf(*mount);
  // The device is opened before the unmount, so that its fsync reports data that could not be written.
  TUniqueFd const source = Open(AT_FDCWD, mount->fSource, O_RDONLY | O_NONBLOCK);
  try {
    TInterruptsBlocked const blocked;
    TOSSpecific::UnmountDevice(mount->fSource, directory);
  } catch (TZEPException const&) {
    Throw(directory + " cannot be unmounted: it is still in use");
  }
  if (source) ThrowIf(::fsync(source.get()) != 0, mount->fSource + " is unmounted, but not all data could be written to it");
  return MountPointsOf(drives);
}

std::string RemovalText(std::vector<std::string> const& stillMountedAt) {
  if (stillMountedAt.empty()) return "can be removed";
  std::string text = "is still mounted at";
  for (std::string const& mountPoint : stillMountedAt) text += " " + Printable(mountPoint);
  return text;
}

}  // namespace NQRVZEP20::zep
