// SPDX-License-Identifier: Apache-2.0

// Tests MountDevice and UnmountDevice with real images. Regular files serve as devices: mount sets up a loop device itself.

#include "tests/system/media/MediaSupport.h"

namespace NQRVZEP20 {
namespace {

// Returns the result of the function, which is run in a child that has private mount points.
template <class TFunction>
std::string WithMountPoints(TFunction function) {
  return InChild([&] {
    MakeMountPoints();
    return function();
  });
}

std::string StatusOf(std::function<void()> const& function) {
  try {
    function();
    return "no exception";
  } catch (TZEPException const& thrown) {
    return thrown.what();
  }
}

class MediaMountTest : public testing::Test {
protected:
  void SetUp() override {
    NEEDS_IMAGES();
    MakeImage(fDir.Path("key"), "whole");
    MakeImage(fDir.Path("part1"), "partition");  // the first partition of the "device" part, which itself cannot be mounted
    WriteFile(fDir.Path("part"), std::string(4096, '\0'));
  }

  TTempDir fDir;
  std::string const fKey = fDir.Path("key"), fPart = fDir.Path("part");
};

TEST_F(MediaMountTest, AWholeDeviceIsMountedAndUnmounted) {
  EXPECT_EQ(WithMountPoints([&] {
              std::string text = TOSSpecific::MountDevice(fKey);
              text += " " + ReadFile("/mnt/key/label.txt");
              TOSSpecific::UnmountDevice("whatever", "/mnt/key");
              return text + (TOSSpecific::FileExists("/mnt/key/label.txt") ? " mounted" : " unmounted");
            }),
            "/mnt/key whole unmounted");
}

TEST_F(MediaMountTest, AFirstPartitionIsMountedWhenTheDeviceHasNoFileSystem) {
  EXPECT_EQ(WithMountPoints([&] {
              std::string const mountPoint = TOSSpecific::MountDevice(fPart);
              return mountPoint + " " + ReadFile("/mnt/key/label.txt");
            }),
            "/mnt/key partition");
}

TEST_F(MediaMountTest, AMountedKeyIsNotReplacedByAnotherDevice) {
  EXPECT_EQ(WithMountPoints([&] {
              TOSSpecific::MountDevice(fKey);
              std::string const mounts = ReadFile("/proc/self/mounts");
              std::string const mountPoint = TOSSpecific::MountDevice(fPart);
              bool const isUnchanged = ReadFile("/proc/self/mounts") == mounts;
              return mountPoint + " " + ReadFile("/mnt/key/label.txt") + (isUnchanged ? " unchanged" : " changed");
            }),
            "/mnt/key whole unchanged");
}

TEST_F(MediaMountTest, AMountedKeyDoesNotPreventMountingAFloppy) {
  EXPECT_EQ(WithMountPoints([&] {
              TOSSpecific::MountDevice(fKey);
              return StatusOf([] { TOSSpecific::MountDevice("/dev/fd1"); });  // missing: the failure shows that it was tried
            }),
            "kZEPStatusFileSystemError");
}

TEST_F(MediaMountTest, AFailureToMountThrows) {
  struct TRow {
    char const* fWhat;
    std::function<void()> fPrepare;
    std::string fDevice;
  };
  TRow const rows[] = {
      {"no file system", [] {}, "/dev/null"},
      {"a missing device", [] {}, fDir.Path("nothing")},
      {"a device that is removed", [&] { std::filesystem::remove(fKey); }, fKey},
      {"no mount point", [] { std::filesystem::remove("/mnt/key"); }, fKey},
  };
  for (TRow const& row : rows)
    EXPECT_EQ(WithMountPoints([&] {
                row.fPrepare();
                return StatusOf([&] { TOSSpecific::MountDevice(row.fDevice); });
              }),
              "kZEPStatusFileSystemError")
        << row.fWhat;
}

TEST_F(MediaMountTest, ABusyOrUnusedMountPointCannotBeUnmounted) {
  EXPECT_EQ(WithMountPoints([&] {
              std::string text = StatusOf([] { TOSSpecific::UnmountDevice("", "/mnt/key"); });
              TOSSpecific::MountDevice(fKey);
              std::ifstream const user("/mnt/key/label.txt");
              text += " " + StatusOf([] { TOSSpecific::UnmountDevice("", "/mnt/key"); });
              return text + (TOSSpecific::FileExists("/mnt/key/label.txt") ? " mounted" : " unmounted");
            }),
            "kZEPStatusFileSystemError kZEPStatusFileSystemError mounted");
}

}  // namespace
}  // namespace NQRVZEP20
