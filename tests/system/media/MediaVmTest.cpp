// SPDX-License-Identifier: Apache-2.0

// Tests with real removable media: a virtual machine has a SCSI disk, a USB stick, a CD-ROM, a floppy drive and the devices that
// a management controller shows to its host. It is booted once and runs everything (in-vm.sh); each test checks one of the
// results.

#include "tests/Support.h"
#include "tests/os/Programs.h"
#include "tests/tools/zep/Envelope.h"

#include <gmock/gmock.h>
#include <nlohmann/json.hpp>

#include <chrono>
#include <iostream>

namespace NQRVZEP20 {
namespace {

using testing::EndsWith;
using testing::HasSubstr;
using testing::Not;
using testing::StartsWith;

std::string const kHere = SourcePath("tests/system/media/");
std::string const kVm = SourcePath("tests/system/vm/");

class MediaVmTest : public testing::Test {
protected:
  static void SetUpTestSuite() {
    for (char const* tool : {"qemu-system-x86_64", "busybox", "cpio", "modprobe", "mkfs.vfat", "hwinfo", "lsblk", "blkid"})
      if (RunProgram(std::string("PATH=$PATH:/usr/sbin:/sbin; command -v ") + tool).fExitCode != 0)
        gMissing = std::string(tool) + " is not installed";
    if (!gMissing.empty()) return;
    TProgramRun const fetch = RunProgram("sh " + kVm + "fetch-kernel.sh full 2>&1");
    if (fetch.fExitCode != 0) gMissing = "no kernel: " + fetch.fOutput;
    if (!gMissing.empty()) return;

    auto const start = std::chrono::steady_clock::now();
    gResults = new TTempDir;
    gRun =
        RunProgram("PATH=$PATH:/usr/sbin:/sbin; sh " + kVm + "run-in-vm.sh --gadgets --timeout 700 --out " + gResults->Path() +
                   Files() + " sh " + kHere + "in-vm.sh " + ZEP_MEDIA_PROBE + " " + ZEP_PROGRAM + " " + ZEP_PULLS_OUT + " 2>&1");
    std::chrono::duration<double> const seconds = std::chrono::steady_clock::now() - start;
    std::cout << "the virtual machine took " << seconds.count() << " s\n";
  }
  static void TearDownTestSuite() {
    delete gResults;
    gResults = nullptr;
  }

  void SetUp() override {
    NEEDS(gMissing.empty(), gMissing);
    ASSERT_EQ(gRun.fExitCode, 0) << gRun.fOutput;
  }

  static std::string Result(std::string const& name) { return ReadFile(gResults->Path(name)); }

  static inline std::string gMissing;
  static inline TTempDir* gResults = nullptr;
  static inline TProgramRun gRun{"", -1};

private:
  // The files that are copied into the machine, each program with the libraries that it links.
  static std::string Files() {
    std::string files;
    for (char const* program : {"hwinfo", "lsblk", "blkid"}) {
      std::string const path = RunProgram(std::string("PATH=$PATH:/usr/sbin:/sbin; command -v ") + program).fOutput;
      files += " --file " + path.substr(0, path.find('\n'));
    }
    for (std::string const& file :
         {kHere + "in-vm.sh", std::string(ZEP_MEDIA_PROBE), std::string(ZEP_PROGRAM), std::string(ZEP_PULLS_OUT),
          BuildPath("lib/libHost.nsp.so"), BuildPath("lib/libsmbios.so"), BuildPath("share/zepcore")})
      files += " --file " + file;
    return files;
  }
};

// ---- The library ----

TEST_F(MediaVmTest, TheControllersVirtualDevicesAreFound) {
  EXPECT_EQ(Result("virtual-disk"), "/dev/sdc (/dev/sg3)\n");
  EXPECT_EQ(Result("virtual-cdrom"), "/dev/sr1\n");
  EXPECT_THAT(Result("virtual-keyboard"), testing::MatchesRegex("/dev/input/event[0-9]+\n"));
  EXPECT_EQ(Result("virtual-mouse"), "/dev/input/mice\n");
}

TEST_F(MediaVmTest, UsbDisksAndTheFloppyDriveAreEnumerated) {
  EXPECT_EQ(Result("enumerate"),
            "/dev/sdb|QEMU QEMU HARDDISK|/mnt/key\n"
            "/dev/sdc|Example Virtual Disk|/mnt/key\n"
            "/dev/fd0|Built-in Floppy Drive|/mnt/floppy\n"
            "[Error] ERROR: CaptureFile failed to open: /proc/bus/usb/devices\n"
            "/dev/sdb1 /mnt/key vfat\n");
}

TEST_F(MediaVmTest, DisksAreFoundByAddressOrGenericNode) {
  EXPECT_EQ(Result("ids"),
            "/dev/sdc|Maker Disk|/mnt/key\n"
            "/dev/sdc|Maker Disk|/mnt/key\n"
            "/dev/fd0|Built-in Floppy Drive|/mnt/floppy\n"
            "[Error] ERROR: CaptureFile failed to open: /proc/bus/usb/devices\n"
            "[Debug] No mapping found for Maker - Disk - /dev/sg9\n"
            "[Debug] No mapping found for Maker - Disk - /dev/sda\n"
            "[Debug] No mapping found for Maker - Disk - 9:9:9:9\n");
}

TEST_F(MediaVmTest, DevicesAreMountedWholeOrByTheirFirstPartition) {
  EXPECT_EQ(Result("mounts"),
            "/mnt/key\n/dev/sda /mnt/key vfat\n"
            "/mnt/key\n/dev/sdb1 /mnt/key vfat\n"
            "/mnt/key\n/dev/sdc /mnt/key vfat\n"
            "/mnt/floppy\n/dev/fd0 /mnt/floppy vfat\n"
            "kZEPStatusFileSystemError\n"
            "kZEPStatusFileSystemError\n");
}

TEST_F(MediaVmTest, AMountedKeyIsAcceptedForAnotherDeviceAndUnmountedByItsMountPoint) {
  EXPECT_EQ(Result("second-key"), "/mnt/key\n/mnt/key\n/dev/sdb1 /mnt/key vfat\nkZEPStatusFileSystemError\n");
}

TEST_F(MediaVmTest, ADiskThatVanishesAfterTheListingIsSkipped) {
  EXPECT_EQ(Result("vanished"),
            "/dev/sdb|QEMU QEMU HARDDISK|/mnt/key\n"
            "/dev/fd0|Built-in Floppy Drive|/mnt/floppy\n"
            "[Error] ERROR: CaptureFile failed to open: /proc/bus/usb/devices\n"
            "[Debug] No mapping found for Example - Virtual Disk - 2:0:0:0\n");
}

// ---- zep ----

nlohmann::json MediumIn(std::string const& document, std::string const& device) {
  auto const list = nlohmann::json::parse(document, nullptr, false);
  if (!list.is_object()) return nullptr;
  for (auto const& medium : list["media"])
    if (medium["device"] == device) return medium;
  return nullptr;
}

TEST_F(MediaVmTest, ZepListsMediaWithLabelAndMountPoint) {
  std::string const list = Result("list.json"), mounted = Result("list-mounted.json");
  zep::ExpectEnvelope(list, 0, "zep media");
  EXPECT_EQ(MediumIn(list, "/dev/sdb1"), nlohmann::json::parse(R"({"device":"/dev/sdb1","description":"QEMU HARDDISK",
    "size":7340032,"label":"STICK","fileSystem":"vfat","readOnly":false,"mounted":false,"mountPoints":[]})"));
  EXPECT_EQ(MediumIn(list, "/dev/sdc")["label"], "VMEDIA");
  EXPECT_EQ(MediumIn(list, "/dev/fd0")["label"], "FLOPPY");
  EXPECT_EQ(MediumIn(list, "/dev/sr1")["description"], "Example Virtual CDROM");
  EXPECT_TRUE(MediumIn(list, "/dev/sda").is_null());  // a disk inside the machine
  EXPECT_EQ(MediumIn(mounted, "/dev/sdb1")["mountPoints"], nlohmann::json::parse(R"(["/mnt/key"])"));
  EXPECT_EQ(MediumIn(mounted, "/dev/sdc")["mounted"], false);
}

TEST_F(MediaVmTest, AnEmptyOpticalDriveIsNotListed) {
  std::string const full = Result("list-full.json"), empty = Result("list-empty.json");
  EXPECT_EQ(MediumIn(full, "/dev/sr0")["description"], "QEMU CD-ROM");
  EXPECT_TRUE(MediumIn(empty, "/dev/sr0").is_null()) << empty;
  EXPECT_EQ(MediumIn(empty, "/dev/sr1")["description"], "Example Virtual CDROM");
}

TEST_F(MediaVmTest, ZepMountsAndUnmounts) {
  EXPECT_EQ(Result("zep-mount"), "/dev/sdb1 is mounted at /mnt/key\n/mnt/key is unmounted; the medium can be removed\n");
}

TEST_F(MediaVmTest, AReportIsReadBackFromTheStick) {
  EXPECT_THAT(Result("report"), StartsWith("The report is zep-report-sample-server-"));
  EXPECT_THAT(Result("report"), HasSubstr(".txt on /dev/sdb1, which can be removed.\nexit status 2\nSAMPLE sample-server: "));
  EXPECT_THAT(Result("report"), HasSubstr("filled root/zep/host\n"));
}

// Expects that success is not reported and that no report is left.
void ExpectFailure(std::string const& text, std::string const& reason) {
  EXPECT_THAT(text, StartsWith("zep: zep-report-sample-server-"));
  EXPECT_THAT(text, HasSubstr(" cannot be written to /dev/sdc: " + reason));
  EXPECT_THAT(text, HasSubstr("\nexit status 1\n"));
  EXPECT_THAT(text, Not(HasSubstr("can be removed")));
}

TEST_F(MediaVmTest, AFullMediumIsAFailure) {
  ExpectFailure(Result("full"), "No space left on device");
  EXPECT_THAT(Result("full"), EndsWith("\nexit status 1\nfiller\n"));
}

TEST_F(MediaVmTest, AReadOnlyMediumIsAFailure) {
  ExpectFailure(Result("read-only"), "the medium is read-only");
  EXPECT_THAT(Result("read-only"), EndsWith("\nexit status 1\n"));
}

TEST_F(MediaVmTest, AMediumPulledOutDuringTheWriteIsAFailure) {
  for (std::string const sync : {"1", "2"}) {
    SCOPED_TRACE(sync);
    std::string const text = Result("pulled-out-" + sync);
    ExpectFailure(text, "");
    std::string const left = text.substr(text.find("exit status 1\n") + 14);
    EXPECT_THAT(left, Not(HasSubstr(".txt\n")));
    EXPECT_THAT(left, Not(HasSubstr("/dev/sdc")));  // no longer mounted
  }
}

}  // namespace
}  // namespace NQRVZEP20
