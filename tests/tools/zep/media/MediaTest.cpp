// SPDX-License-Identifier: Apache-2.0

// Tests zep media: names, the output of lsblk, blkid and the kernel, and the command with stand-ins for these programs.
// tests/system/media tests it with real media.

#include "tools/zep/media/Media.h"

#include "tests/tools/zep/Zep.h"
#include "tools/zep/output/Failure.h"

#include <gmock/gmock.h>
#include <sys/sysmacros.h>

namespace NQRVZEP20::zep {
namespace {

using testing::ElementsAre;
using testing::HasSubstr;
using testing::IsEmpty;
using testing::StartsWith;

std::string Sample() { return ReadFile(TestDataPath("lsblk/devices.json")); }

// ---- Names ----

TEST(MediaTest, APlainPathHasNoCharacterThatTheShellInterprets) {
  for (char const* name : {"/dev/sdb", "/dev/disk/by-id/usb-A_b-0.1", "/dev/..x", "/a..", "/dev/sdb.", "/"})
    EXPECT_TRUE(IsPlainPath(name)) << name;
  for (char const* name : {"",           "dev/sdb",       "/dev/sdb ",   "/dev/sd b",  "/dev/sd;b",  "/dev/sd&b", "/dev/$b",
                           "/dev/`b`",   "/dev/sd\nb",    "/dev/sd\"b",  "/dev/sd'b",  "/dev/sd\\b", "/dev/sd*",  "/dev/sd?",
                           "/dev/sd[b]", "/dev/sd|b",     "/dev/sd>b",   "/dev/sd<b",  "/dev/sd(b",  "/dev/sd#b", "/dev/sd!b",
                           "/dev/~b",    "/dev/sd=b",     "/dev/sd,b",   "/dev/sd:b",  "/dev/sd@b",  "/dev/sd+b", "/dev/sd%b",
                           "/dev/sd\tb", "/dev/\xc3\xa4", "/dev/../etc", "/dev/./sdb", "/dev/..",    "/dev/.",    "/../dev"})
    EXPECT_FALSE(IsPlainPath(name)) << name;
}

TEST(MediaTest, TrailingSlashesAreStripped) {
  struct TRow {
    char const *fName, *fStripped;
  };
  TRow const rows[] = {{"/mnt/key", "/mnt/key"},
                       {"/mnt/key/", "/mnt/key"},
                       {"/mnt/key///", "/mnt/key"},
                       {"/mnt//key", "/mnt//key"},
                       {"/", "/"},
                       {"//", "/"},
                       {"", ""}};
  for (TRow const& row : rows) EXPECT_EQ(WithoutTrailingSlashes(row.fName), row.fStripped) << row.fName;
}

TEST(MediaTest, ADeviceMustExistBelowDev) {
  EXPECT_NO_THROW(CheckDevice("/dev/null"));
  for (char const* name : {"/etc/passwd", "/dev", "/dev/", "/devx/sdb", "/dev/null;x", "/dev/../etc/passwd", "", "null"})
    EXPECT_THROW(CheckDevice(name), std::runtime_error) << name;
  EXPECT_THROW(CheckDevice("/etc/passwd"), TWrongUsage);
  EXPECT_THROW(CheckDevice("/dev/null;x"), TWrongUsage);
  try {
    CheckDevice("/dev/no-such-device");
    FAIL();
  } catch (TWrongUsage const&) {
    FAIL() << "the name itself is valid";
  } catch (std::runtime_error const& failure) {
    EXPECT_STREQ(failure.what(), "the device /dev/no-such-device does not exist");
  }
}

// ---- lsblk and blkid ----

std::vector<std::string> TextsOf(std::vector<TMedium> const& media) {
  std::vector<std::string> texts;
  for (TMedium const& medium : media) {
    std::string text = medium.fDevice + "|" + medium.fDescription + "|" + medium.fLabel + "|" + medium.fFileSystem + "|" +
                       std::to_string(medium.fSize) + (medium.fIsReadOnly ? "|ro" : "");
    for (std::string const& mountPoint : medium.fMountPoints) text += "|" + mountPoint;
    texts.push_back(text);
  }
  return texts;
}

TEST(MediaTest, RemovableDrivesAndTheirPartitionsAreMedia) {
  EXPECT_THAT(TextsOf(MediaIn(Sample())),
              ElementsAre("/dev/fd0||||0", "/dev/sdb1|QEMU HARDDISK|||7340032", "/dev/sdc|Example Virtual Disk|||4194304",
                          "/dev/sr0|QEMU CD-ROM|||2097152|ro", "/dev/sr1|Example Virtual CDROM|||1048576|ro"));
}

TEST(MediaTest, RemovableDrivesAndUsbDrivesAreListed) {
  struct TRow {
    char const* fFields;
    bool fIsMedium;
  };
  TRow const rows[] = {
      {R"("type":"disk","rm":true,"tran":null)", true},
      {R"("type":"disk","rm":false,"tran":"usb")", true},
      {R"("type":"rom","rm":true,"tran":"sata")", true},
      {R"("type":"disk","rm":false,"tran":"sata")", false},
      {R"("type":"disk","rm":false,"tran":null)", false},
      {R"("type":"loop","rm":true,"tran":null)", false},
      {R"("rm":true)", false},
  };
  for (TRow const& row : rows)
    EXPECT_EQ(MediaIn(std::string("{\"blockdevices\":[{\"name\":\"/dev/x\",") + row.fFields + "}]}").size(),
              row.fIsMedium ? 1u : 0u)
        << row.fFields;
}

TEST(MediaTest, EachPartitionIsListedSeparately) {
  EXPECT_THAT(TextsOf(MediaIn(R"(lsblk: a warning
{"blockdevices":[{"name":"/dev/sdb","type":"disk","size":9,"rm":true,"vendor":"Maker ","model":"Key","fstype":"iso9660",
 "label":"LIVE","mountpoints":[null],"children":[
 {"name":"/dev/sdb1","type":"part","size":5,"label":"A B","fstype":"vfat","ro":true,"mountpoints":["/mnt/key","/media/a b"]},
 {"name":"/dev/sdb2","type":"part","size":4}]}]})")),
              ElementsAre("/dev/sdb|Maker Key|LIVE|iso9660|9", "/dev/sdb1|Maker Key|A B|vfat|5|ro|/mnt/key|/media/a b",
                          "/dev/sdb2|Maker Key|||4"));
}

TEST(MediaTest, TheMountPointOfAnOpenedVolumeBelongsToItsMedium) {
  EXPECT_THAT(TextsOf(MediaIn(R"({"blockdevices":[
 {"name":"/dev/sdb","type":"disk","rm":true,"mountpoints":[null],"children":[
  {"name":"/dev/sdb1","type":"part","fstype":"crypto_LUKS","mountpoints":[null],"children":[
   {"name":"/dev/mapper/key","type":"crypt","mountpoints":["/media/key"],"children":[
    {"name":"/dev/mapper/a","type":"lvm","mountpoints":["/media/a"]},
    {"name":"/dev/mapper/b","type":"lvm","mountpoints":[null]}]}]},
  {"name":"/dev/sdb2","type":"part","fstype":"vfat","mountpoints":[null]}]},
 {"name":"/dev/sdc","type":"disk","rm":true,"fstype":"crypto_LUKS","mountpoints":[null],"children":[
  {"name":"/dev/mapper/whole","type":"crypt","mountpoints":["/media/whole"]}]},
 {"name":"/dev/sdd","type":"disk","rm":true,"fstype":"iso9660","mountpoints":[null],"children":[
  {"name":"/dev/sdd1","type":"part","mountpoints":["/media/part"]}]}]})")),
              ElementsAre("/dev/sdb1|||crypto_LUKS|0|/media/key|/media/a", "/dev/sdb2|||vfat|0",
                          "/dev/sdc|||crypto_LUKS|0|/media/whole", "/dev/sdd|||iso9660|0", "/dev/sdd1||||0|/media/part"));
}

TEST(MediaTest, OnlyRomDrivesAreOptical) {
  std::vector<std::string> optical;
  for (TMedium const& medium : MediaIn(Sample()))
    if (medium.fIsOptical) optical.push_back(medium.fDevice);
  EXPECT_THAT(optical, ElementsAre("/dev/sr0", "/dev/sr1"));
}

TEST(MediaTest, OtherOutputOfLsblkIsAnError) {
  for (char const* text : {"", "nothing", "{", "[]", "{}", "{\"blockdevices\":1}", "{\"blockdevices\":[]} x"})
    EXPECT_THROW(MediaIn(text), std::runtime_error) << text;
  EXPECT_THAT(MediaIn("{\"blockdevices\":[]}"), IsEmpty());
  EXPECT_THAT(MediaIn("{\"blockdevices\":[1, null, \"x\"]}"), IsEmpty());
}

TEST(MediaTest, LabelAndFileSystemAreTakenFromBlkid) {
  TMedium medium{};
  ReadLabel("DEVNAME=/dev/sdb1\nLABEL_FATBOOT=OTHER\nLABEL=MY KEY\nUUID=1234-ABCD\nTYPE=vfat\nUSAGE=filesystem\n", medium);
  EXPECT_EQ(medium.fLabel, "MY KEY");
  EXPECT_EQ(medium.fFileSystem, "vfat");
  ReadLabel("", medium);
  EXPECT_EQ(medium.fLabel, "MY KEY");
}

// ---- mountinfo ----

TEST(MediaTest, AMountIsFoundByItsCompleteMountPoint) {
  std::string const info =
      "22 27 0:21 / /proc rw,relatime - proc proc rw\n"
      "40 27 8:17 / /mnt/key rw,noatime shared:1 master:2 - vfat /dev/sdb1 rw,fmask=0022\n"
      "41 27 8:32 / /mnt/key2 ro,relatime - ext4 /dev/sdc rw\n"
      "42 27 11:0 / /media/a\\040b rw - iso9660 /dev/disk\\0401 ro\n"
      "43 27 2:0 / /mnt/floppy rw,errors=remount-ro - vfat /dev/fd0 rw,errors=remount-ro\n"
      "44 43 7:5 / /mnt/floppy rw - ext4 /dev/loop5 rw\n"
      "broken\n";
  struct TRow {
    char const *fDirectory, *fSource;
    unsigned fMajor, fMinor;
    bool fIsReadOnly;
  };
  TRow const rows[] = {
      {"/mnt/key", "/dev/sdb1", 8, 17, false},
      {"/mnt/key2", "/dev/sdc", 8, 32, true},
      {"/media/a b", "/dev/disk 1", 11, 0, true},
      {"/mnt/floppy", "/dev/loop5", 7, 5, false},  // the later mount is on top
  };
  for (TRow const& row : rows) {
    SCOPED_TRACE(row.fDirectory);
    auto const mount = MountIn(info, row.fDirectory);
    ASSERT_TRUE(mount);
    EXPECT_EQ(mount->fSource, row.fSource);
    EXPECT_EQ(mount->fDevice, ::gnu_dev_makedev(row.fMajor, row.fMinor));
    EXPECT_EQ(mount->fIsReadOnly, row.fIsReadOnly);
  }
  for (char const* directory : {"/mnt", "/mnt/ke", "/mnt/key/", "/", "", "broken"})
    EXPECT_FALSE(MountIn(info, directory)) << directory;
}

TEST(MediaTest, AllMountsAreListedInOrder) {
  std::vector<std::string> texts;
  for (TMount const& mount :
       MountsIn("40 27 8:17 / /mnt/a\\040b rw - vfat /dev/sdb1 rw\nbroken\n"
                "41 27 0:33 / /mnt/key rw - nfs server:/x rw\n40 27 8:17 / /mnt/key rw - vfat /dev/sdb1 rw\n"))
    texts.push_back(mount.fMountPoint + "|" + mount.fSource);
  EXPECT_THAT(texts, ElementsAre("/mnt/a b|/dev/sdb1", "/mnt/key|server:/x", "/mnt/key|/dev/sdb1"));
}

// ---- The command ----

class MediaCommandTest : public testing::Test {
protected:
  void SetUp() override { fs::create_directory(fInstallation.Path("stand-ins")); }

  void AddStandIn(std::string const& name, std::string const& body) {
    std::string const path = fInstallation.Path("stand-ins/" + name);
    WriteFile(path, "#!/bin/sh\n" + body + "\n");
    fs::permissions(path, fs::perms::all);
  }
  TRun Run(std::vector<std::string> arguments, bool asNobody = false) {
    arguments.insert(arguments.begin(), "media");
    return fInstallation.Run({arguments, {{"PATH", fInstallation.Path("stand-ins") + ":/usr/bin:/bin"}}, asNobody});
  }

  TInstallation fInstallation;
};

TEST_F(MediaCommandTest, ListsMediaAsATable) {
  // The stand-in renames the optical drives to names that no machine has, because this machine's drives may be empty.
  AddStandIn("lsblk", "sed s,/dev/sr,/dev/xr, " + TestDataPath("lsblk/devices.json"));
  AddStandIn("blkid", "test $4 != /dev/sdb1 || printf 'LABEL=STICK\\nTYPE=vfat\\n'");
  if (fs::exists("/run/udev/data")) GTEST_SKIP() << "zep does not run blkid where udev runs";
  NEEDS(::geteuid() == 0, "zep runs blkid only as root");
  for (std::vector<std::string> const& arguments : {std::vector<std::string>{}, std::vector<std::string>{"list"}}) {
    TRun const run = Run(arguments);
    EXPECT_EQ(run.fStatus, 0) << run.fErrors;
    EXPECT_EQ(run.fOutput,
              "Device        Size       Label        File system  Mounted at    Description\n"
              "/dev/fd0      -          -            -            -             -\n"
              "/dev/sdb1     7 MiB      STICK        vfat         -             QEMU HARDDISK\n"
              "/dev/sdc      4 MiB      -            -            -             Example Virtual\n"
              "                                                                 Disk\n"
              "/dev/xr0      2 MiB      -            -            -             QEMU CD-ROM\n"
              "                                                   (read-only)\n"
              "/dev/xr1      1 MiB      -            -            -             Example Virtual\n"
              "                                                   (read-only)   CDROM\n");
  }
}

TEST_F(MediaCommandTest, TheTableShowsSizesAndMountPoints) {
  struct TRow {
    std::string fSize, fShown;
  };
  TRow const rows[] = {
      {"512", "512 B"},          {"1024", "1 KiB"},       {"1536", "1.5 KiB"},         {"7864320", "7.5 MiB"},
      {"8053063680", "7.5 GiB"}, {"8589934592", "8 GiB"}, {"15728640000", "14.6 GiB"}, {"2199023255552", "2 TiB"}};
  std::string list;
  for (TRow const& row : rows)
    list += std::string(list.empty() ? "" : ",") + R"({"name":"/dev/sdb","type":"disk","rm":true,"model":"Key","size":)" +
            row.fSize + R"(,"mountpoints":["/mnt/key","/media/a"]})";
  AddStandIn("lsblk", "echo '{\"blockdevices\":[" + list + "]}'");
  AddStandIn("blkid", "exit 2");
  std::vector<std::string> const lines = LinesOf(Run({}).fOutput);
  ASSERT_EQ(lines.size(), 1 + 2 * std::size(rows));
  for (std::size_t i = 0; i < std::size(rows); ++i) {
    std::string const size = rows[i].fShown + std::string(11 - rows[i].fShown.size(), ' ');
    EXPECT_EQ(lines[1 + 2 * i], "/dev/sdb      " + size + "-            -            /mnt/key      Key");
    EXPECT_EQ(lines[2 + 2 * i], std::string(51, ' ') + "/media/a");
  }
}

TEST_F(MediaCommandTest, ListsMediaAsJson) {
  AddStandIn(
      "lsblk",
      R"(echo '{"blockdevices":[{"name":"/dev/sdb","type":"disk","size":8053063680,"rm":true,"label":"KEY","fstype":"vfat",)"
      R"("mountpoints":["/mnt/key"],"model":"Key"}]}')");
  AddStandIn("blkid", "exit 2");
  for (std::vector<std::string> const& arguments : {std::vector<std::string>{"--json"}, {"list", "--json"}, {"--json", "list"}}) {
    TRun const run = Run(arguments);
    EXPECT_EQ(run.fStatus, 0) << run.fErrors;
    EXPECT_EQ(JsonOf(run)["document"], "zep media");
    EXPECT_EQ(JsonOf(run)["media"], nlohmann::json::parse(R"([{"device":"/dev/sdb","description":"Key","size":8053063680,
      "label":"KEY","fileSystem":"vfat","readOnly":false,"mounted":true,"mountPoints":["/mnt/key"]}])"));
  }
}

TEST_F(MediaCommandTest, WithoutMediaTheStatusIsOne) {
  AddStandIn("lsblk", "echo '{\"blockdevices\":[]}'");
  TRun const run = Run({});
  EXPECT_EQ(run.fStatus, 1);
  EXPECT_EQ(run.fOutput, "");
  EXPECT_EQ(run.fErrors, "zep: no removable medium was found\n");
  TRun const asJson = Run({"--json"});
  EXPECT_EQ(asJson.fStatus, 1);
  EXPECT_THAT(JsonOf(asJson)["media"], IsEmpty());
}

TEST_F(MediaCommandTest, AFailureOfLsblkIsReported) {
  AddStandIn("lsblk", "echo 'lsblk: no sysfs' >&2; exit 1");
  TRun run = Run({});
  EXPECT_EQ(run.fStatus, 1);
  EXPECT_EQ(run.fErrors, "zep: lsblk failed: lsblk: no sysfs\n");
  AddStandIn("lsblk", "exit 1");
  EXPECT_EQ(Run({}).fErrors, "zep: lsblk is missing, or failed without a message; it is in the package util-linux\n");
  AddStandIn("lsblk", "echo usage");
  run = Run({});
  EXPECT_EQ(run.fStatus, 1);
  EXPECT_THAT(run.fErrors, StartsWith("zep: lsblk did not print its list as JSON, but: usage"));
}

TEST_F(MediaCommandTest, UnreadableLabelsAreReported) {
  if (fs::exists("/run/udev/data")) GTEST_SKIP() << "where udev runs, everyone can read labels";
  AddStandIn("lsblk", "cat " + TestDataPath("lsblk/devices.json"));
  AddStandIn("blkid", "echo LABEL=never read");
  TRun const run = Run({"--json"}, true);
  EXPECT_EQ(run.fStatus, 2);
  EXPECT_EQ(run.fErrors, "zep: only root can read labels and file systems\n");
  EXPECT_EQ(JsonOf(run)["labelsReadable"], false);
  EXPECT_EQ(JsonOf(run)["media"][1]["label"], nullptr);
}

TEST_F(MediaCommandTest, InvalidNamesAreRefusedBeforeAnyProgramRuns) {
  for (char const* program : {"mount", "umount"}) AddStandIn(program, "echo run >> " + fInstallation.Path("run"));
  struct TRow {
    std::vector<std::string> fArguments;
    int fStatus;
    char const* fErrors;
  };
  TRow const rows[] = {
      {{"mount", "/dev/sdb;reboot"}, 64, "zep: \"/dev/sdb;reboot\" is not a device name"},
      {{"mount", "/etc/passwd"}, 64, "zep: \"/etc/passwd\" is not a device name"},
      {{"mount", "/dev/../etc/passwd"}, 64, "zep: \"/dev/../etc/passwd\" is not a device name"},
      {{"mount", "/dev/$HOME"}, 64, "zep: \"/dev/$HOME\" is not a device name"},
      {{"mount", "/dev/no-such-device"}, 1, "zep: the device /dev/no-such-device does not exist"},
      {{"umount", "/mnt/key;reboot"}, 64, "zep: \"/mnt/key;reboot\" is not a mount point of a medium"},
      {{"umount", "/"}, 64, "zep: \"/\" is not a mount point of a medium"},
      {{"umount", "/home"}, 64, "zep: \"/home\" is not a mount point of a medium"},
      {{"umount", "/mnt/../home"}, 64, "zep: \"/mnt/../home\" is not a mount point of a medium"},
      {{"umount", "/mnt/"}, 64, "zep: \"/mnt\" is not a mount point of a medium"},
      {{"umount", "/mnt/nothing-mounted-here"}, 1, "zep: nothing is mounted at /mnt/nothing-mounted-here\n"},
      {{"umount", "/mnt/nothing-mounted-here/"}, 1, "zep: nothing is mounted at /mnt/nothing-mounted-here\n"},
      {{"mount"}, 64, "zep: device is required"},
      {{"umount"}, 64, "zep: directory is required"},
      {{"eject"}, 64, "zep: unknown command \"eject\""},
  };
  for (TRow const& row : rows) {
    SCOPED_TRACE(testing::PrintToString(row.fArguments));
    TRun const run = Run(row.fArguments);
    EXPECT_EQ(run.fStatus, row.fStatus);
    EXPECT_THAT(run.fErrors, StartsWith(row.fErrors));
    EXPECT_EQ(run.fOutput, "");
  }
  EXPECT_FALSE(fs::exists(fInstallation.Path("run")));
}

TEST_F(MediaCommandTest, AReportIsWrittenOnlyToADeviceName) {
  for (char const* name : {"/tmp", "/dev/sdb;x", "key"}) {
    TRun const run = fInstallation.Run({{"report", "--sample", "--to-media", name}});
    EXPECT_EQ(run.fStatus, 64) << name;
    EXPECT_THAT(run.fErrors, HasSubstr("is not a device name"));
    EXPECT_EQ(run.fOutput, "");
  }
  TRun const run = fInstallation.Run({{"report", "--sample", "--to-media", "/dev/no-such-device"}});
  EXPECT_EQ(run.fStatus, 1);
  EXPECT_EQ(run.fErrors, "zep: the device /dev/no-such-device does not exist\n");
}

}  // namespace
}  // namespace NQRVZEP20::zep
