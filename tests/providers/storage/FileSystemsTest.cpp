// SPDX-License-Identifier: Apache-2.0
#include "providers/storage/FileSystems.h"

#include "tests/providers/storage/MachineTree.h"

namespace NQRVZEP20 {
namespace {

class FileSystemsTest : public testing::Test {
protected:
  void AddDevice(std::string const& name, std::string const& number, std::string const& udev = "") {
    TBlockDevice device;
    device.fName = name;
    fDevices.push_back({device, TUdevRecord::From(udev), number});
  }

  // "name, type, device: mount points" of each file system.
  std::vector<std::string> FileSystems(std::string const& mountInfo) const {
    constexpr char const* kPlaces[] = {"on device", "in memory", "elsewhere"};
    std::vector<std::string> texts;
    for (TFileSystem const& system : FileSystemsOf(MountsFrom(mountInfo), fDevices)) {
      std::string text = system.fName + ", " + system.fType + " " + kPlaces[system.fPlace] + " " + system.fDevice + ":";
      for (TMount const& mount : system.fMounts) text += " " + mount.fMountPoint;
      texts.push_back(text + (system.fIsCovered ? " covered" : ""));
    }
    return texts;
  }

  std::vector<TKnownDevice> fDevices;
};

TEST_F(FileSystemsTest, ADeviceIsFoundByItsNumber) {
  AddDevice("sda1", "8:1");
  EXPECT_THAT(FileSystems("1 0 8:1 / / rw - ext4 /dev/root rw\n2 1 8:1 /home /home rw - ext4 /dev/root rw\n"),
              ElementsAre("/dev/sda1, ext4 on device sda1: / /home"));
}

TEST_F(FileSystemsTest, TheMountOfTheWholeFileSystemComesFirst) {
  AddDevice("sda1", "8:1");
  EXPECT_THAT(FileSystems("1 0 8:1 /sub /b rw - ext4 /dev/sda1 rw\n2 1 8:1 / /a rw - ext4 /dev/sda1 rw\n"),
              ElementsAre("/dev/sda1, ext4 on device sda1: /a /b"));
}

TEST_F(FileSystemsTest, ABtrfsIsFoundByItsNode) {
  AddDevice("dm-0", "253:0", "S:vg0/root\n");
  EXPECT_THAT(FileSystems("1 0 0:30 /@ / rw - btrfs /dev/vg0/root rw\n"), ElementsAre("/dev/dm-0, btrfs on device dm-0: /"));
}

TEST_F(FileSystemsTest, PlacesOfOtherFileSystems) {
  EXPECT_THAT(
      FileSystems("1 0 0:5 / /dev rw - devtmpfs dev rw\n2 0 0:6 / /proc rw - proc proc rw\n3 0 0:7 / /s rw - nfs4 h:/x rw\n"
                  "4 0 0:8 / /f rw - fuse.sshfs u@h: rw\n5 0 8:9 / /n rw - fuseblk /dev/sdx rw\n6 0 0:9 / /z rw - zfs p/d rw\n"
                  "7 0 0:10 / /c rw - cgroup2 none rw\n8 0 9:9 / / rw - ext4 /dev/gone rw\n"),
      ElementsAre("dev on /dev, devtmpfs in memory : /dev", "h:/x on /s, nfs4 elsewhere : /s",
                  "u@h: on /f, fuse.sshfs elsewhere : /f", "/dev/sdx, fuseblk elsewhere : /n", "p/d on /z, zfs on device : /z",
                  "/dev/gone, ext4 on device : /"));
}

TEST_F(FileSystemsTest, ACoveredMountIsMarkedAndNamesAreUnique) {
  EXPECT_THAT(FileSystems("1 0 0:5 / /t rw - tmpfs tmpfs rw\n2 0 0:6 / /t rw - tmpfs tmpfs rw\n"),
              ElementsAre("tmpfs on /t, tmpfs in memory : /t covered", "tmpfs on /t (2), tmpfs in memory : /t"));
}

TEST_F(FileSystemsTest, FileSystemsThatAreNotMountedAreListed) {
  AddDevice("sda1", "8:1", "E:ID_FS_USAGE=filesystem\nE:ID_FS_TYPE=xfs\nE:ID_FS_LABEL_ENC=a\\x20b\n");
  AddDevice("sda2", "8:2", "E:ID_FS_USAGE=raid\nE:ID_FS_TYPE=LVM2_member\n");
  EXPECT_THAT(FileSystems(""), ElementsAre("/dev/sda1, xfs on device sda1:"));
  EXPECT_EQ(TextOf(FileSystemsOf({}, fDevices).at(0).fLabel), "a b");
  EXPECT_THAT(FileSystems("1 0 8:1 / /a rw - xfs /dev/sda1 rw\n"), ElementsAre("/dev/sda1, xfs on device sda1: /a"));
}

}  // namespace
}  // namespace NQRVZEP20
