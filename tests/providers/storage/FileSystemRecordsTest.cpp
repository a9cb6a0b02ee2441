// SPDX-License-Identifier: Apache-2.0
#include "providers/storage/FileSystemRecords.h"

#include "providers/reasons/TComputerSystem.h"
#include "tests/providers/storage/MachineTree.h"

namespace NQRVZEP20 {
namespace {

class FileSystemRecordsTest : public testing::Test {
protected:
  FileSystemRecordsTest() {
    fTree.Add("/proc/sys/kernel/hostname", "host\n");
    fSystem = TComputerSystem(fTree.fFiles).Record();
  }

  static TFileSystem FileSystem(char const* mountInfo) { return FileSystemsOf(MountsFrom(mountInfo), {}).at(0); }

  TMachineTree fTree;
  TRecord fSystem{"CIM_ComputerSystem", ""};
};

TEST_F(FileSystemRecordsTest, AMountedFileSystemReportsItsUse) {
  fTree.Add("/zep-answers/statvfs/data/values", "4096 1024 1000 400 350 100 60 255\n");
  TRecord const record = LocalFileSystemRecord(fTree.fFiles, FileSystem("1 0 8:1 / /data ro - ext4 /dev/sda1 rw\n"), fSystem);
  EXPECT_THAT(LinesOf(record),
              ElementsAre("CSCreationClassName=CIM_ComputerSystem", "CSName=host", "CreationClassName=CIM_UnixLocalFileSystem",
                          "Name=/dev/sda1", "ElementName=<the device of this file system is not listed in /sys/class/block>",
                          "Root=/data", "FileSystemType=ext4", "ReadOnly=true", "PersistenceType=2", "BlockSize=4096",
                          "ClusterSize=1024", "FileSystemSize=1024000", "AvailableSpace=358400", "MaxFileNameLength=255",
                          "NumberOfFiles=40", "TotalInodes=100", "FreeInodes=60", "FSReservedCapacity=51200"));
}

TEST_F(FileSystemRecordsTest, AFileSystemWithoutInodesHasAReason) {
  fTree.Add("/zep-answers/statvfs/data/values", "4096 4096 1000 400 350 0 0 255\n");
  TRecord const record = LocalFileSystemRecord(fTree.fFiles, FileSystem("1 0 8:1 / /data rw - vfat /dev/sda1 ro,x\n"), fSystem);
  EXPECT_EQ(LineOf(record, "NumberOfFiles"), "<a file system of this type does not limit its files>");
  EXPECT_EQ(LineOf(record, "ReadOnly"), "true");
}

TEST_F(FileSystemRecordsTest, ACoveredFileSystemIsNotAsked) {
  TFileSystem system = FileSystem("1 0 8:1 / /data rw - ext4 /dev/sda1 rw\n");
  system.fIsCovered = true;
  EXPECT_EQ(LineOf(LocalFileSystemRecord(fTree.fFiles, system, fSystem), "FileSystemSize"),
            "<another file system is mounted over /data>");
}

TEST_F(FileSystemRecordsTest, ARemoteFileSystemIsNotAsked) {
  fTree.Add("/zep-answers/statvfs/data/values", "4096 1024 1000 400 350 100 60 255\n");
  TRecord const record = RemoteFileSystemRecord(FileSystem("1 0 0:9 / /data rw - nfs4 server:/x rw\n"), fSystem);
  EXPECT_EQ(LineOf(record, "Name"), "server:/x on /data");
  EXPECT_EQ(LineOf(record, "PersistenceType"), "4");
  EXPECT_EQ(LineOf(record, "FileSystemSize"),
            "<a query would wait until the server or program that provides this file system answers>");
}

TEST_F(FileSystemRecordsTest, Mount) {
  EXPECT_THAT(
      LinesOf(MountRecord(MountsFrom("7 1 8:1 /sub /a rw,noatime shared:1 - ext4 /dev/sda1 rw,discard\n").at(0))),
      ElementsAre("InstanceID=ZEP:mount:7", "ElementName=/a", "MountPoint=/a", "Source=/dev/sda1", "Directory=/sub", "Type=ext4",
                  "Options=rw,noatime", "FileSystemOptions=rw,discard", "Propagation=shared:1", "DeviceNumber=8:1"));
}

TEST_F(FileSystemRecordsTest, SwapArea) {
  EXPECT_THAT(LinesOf(SwapRecord({"/dev/sda2", "partition", 1024, 1, -2})),
              ElementsAre("CreationClassName=ZEP_SwapArea", "Name=/dev/sda2", "Type=partition", "Size=1048576", "Used=1024",
                          "Priority=-2"));
}

}  // namespace
}  // namespace NQRVZEP20
