// SPDX-License-Identifier: Apache-2.0
#pragma once

// Real media for tests: images on loop devices, mounted in the mount namespace of a child process.

#include "tests/os/HostTools.h"
#include "tests/os/Programs.h"

#include <fcntl.h>
#include <sys/file.h>

#include <cstdlib>
#include <stdexcept>

namespace NQRVZEP20 {

// Runs a shell command. Throws, with its output, when it fails.
inline std::string Do(std::string const& command) {
  TProgramRun const run = RunProgram("(" + command + ") 2>&1");
  if (run.fExitCode != 0) throw std::runtime_error(command + ": " + run.fOutput);
  return run.fOutput;
}

// For use in a child: makes /mnt and /run private file systems of the child; /mnt has the two directories for media.
inline void MakeMountPoints() {
  if (!MountTmpfs("/mnt", "") || !MountTmpfs("/run", "")) throw std::runtime_error("cannot mount");
  std::filesystem::create_directory("/mnt/key");
  std::filesystem::create_directory("/mnt/floppy");
}

// Creates an image with an ext4 file system that contains the file label.txt with this text.
inline void MakeImage(std::string const& path, std::string const& label, std::string const& size = "4M") {
  TTempDir const content;
  WriteFile(content.Path("label.txt"), label);
  Do("truncate -s " + size + " " + path);
  Do("/usr/sbin/mke2fs -q -F -t ext4 -m 0 -d " + content.Path() + " " + path);
}

// A loop device with an image. It is detached by the destructor.
class TLoopDevice {
public:
  explicit TLoopDevice(std::string const& image, std::string const& options = "") {
    fPath = Do("/usr/sbin/losetup --find --show " + options + " " + image);
    fPath.erase(fPath.find_last_not_of('\n') + 1);
  }
  ~TLoopDevice() { RunProgram("/usr/sbin/losetup --detach " + fPath + " 2>/dev/null"); }
  TLoopDevice(TLoopDevice const&) = delete;
  TLoopDevice& operator=(TLoopDevice const&) = delete;

  std::string const& Path() const { return fPath; }

private:
  std::string fPath;
};

// Loop devices are shared by the whole machine: other tests of this kind, also those of another build tree, wait until this
// process has ended.
inline bool HasLoopDevicesForItself() {
  static int const lock = ::open("/dev/loop-control", O_RDONLY | O_CLOEXEC);
  return lock >= 0 && ::flock(lock, LOCK_EX) == 0;
}

// Whether this process can mount images.
inline bool MayMountImages() {
  return MayMount() && HasLoopDevicesForItself() &&
         RunProgram("/usr/sbin/losetup --find >/dev/null 2>&1 && test -x /usr/sbin/mke2fs").fExitCode == 0;
}

#define NEEDS_IMAGES() NEEDS(MayMountImages(), "mounting images needs root, loop devices and e2fsprogs")

}  // namespace NQRVZEP20
