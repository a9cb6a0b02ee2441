// SPDX-License-Identifier: Apache-2.0
#include "TOSSpecific.h"
#include "tests/cim/model/Fakes.h"
#include "tests/os/FakeShell.h"
#include "tests/os/HostTools.h"

#include <gmock/gmock.h>

#include <climits>
#include <csignal>
#include <stdexcept>

namespace NQRVZEP20 {
namespace {

namespace fs = std::filesystem;
using TLines = std::vector<std::string>;
using testing::Contains;
using testing::ElementsAre;
using testing::HasSubstr;
using testing::IsEmpty;

std::string Joined(TLines const& lines) {
  std::string text;
  for (std::string const& line : lines) text += line + "\n";
  return text;
}

// ---- MountDevice ----

std::string const kKeyIsMounted = "mount | grep \"/mnt/key type\" >/dev/null";
std::string const kFloppyIsMounted = "mount | grep \"/mnt/floppy type\" >/dev/null";
constexpr int kFails = 1 << 8;  // the result of system() for a command that exits with 1

TEST(MountDeviceTest, FloppyDevicesHaveTheirOwnMountPoint) {
  struct TRow {
    char const *fDevice, *fMountPoint;
  };
  TRow const rows[] = {
      {"/dev/floppy", "/mnt/floppy"}, {"/dev/fd0", "/mnt/floppy"},
      {"/dev/fd1", "/mnt/floppy"},    {"/dev/fd2", "/mnt/key"},
      {"/dev/fd", "/mnt/key"},        {"/dev/fd01", "/mnt/key"},
      {"/dev/fd0 ", "/mnt/key"},      {"fd0", "/mnt/key"},
      {"/dev//fd0", "/mnt/key"},      {"/dev/FD0", "/mnt/key"},
      {"/dev/sdb", "/mnt/key"},       {"/dev/sdb1", "/mnt/key"},
      {"/dev/sr0", "/mnt/key"},       {"", "/mnt/key"},
  };
  for (TRow const& row : rows) {
    SCOPED_TRACE(row.fDevice);
    std::string const mountPoint = row.fMountPoint;
    std::string const isMounted = "mount | grep \"" + mountPoint + " type\" >/dev/null";
    TFakeShell const shell({{isMounted, kFails}});
    EXPECT_EQ(TOSSpecific::MountDevice(row.fDevice), mountPoint);
    EXPECT_THAT(shell.Commands(),
                ElementsAre(isMounted, std::string("mount ") + row.fDevice + " " + mountPoint + " 2>/dev/null"));
  }
}

TEST(MountDeviceTest, AnExistingMountStaysAndIsAccepted) {
  TFakeShell const shell({});
  EXPECT_EQ(TOSSpecific::MountDevice("/dev/sdb"), "/mnt/key");
  EXPECT_EQ(TOSSpecific::MountDevice("/dev/sdc"), "/mnt/key");
  EXPECT_EQ(TOSSpecific::MountDevice("/dev/fd1"), "/mnt/floppy");
  EXPECT_THAT(shell.Commands(), ElementsAre(kKeyIsMounted, kKeyIsMounted, kFloppyIsMounted));
}

TEST(MountDeviceTest, TheFirstPartitionIsTriedWhenTheDeviceItselfCannotBeMounted) {
  TFakeShell const shell({{"mount /dev/sdb1 /mnt/key 2>/dev/null", 0}}, kFails);
  EXPECT_EQ(TOSSpecific::MountDevice("/dev/sdb"), "/mnt/key");
  EXPECT_THAT(shell.Commands(),
              ElementsAre(kKeyIsMounted, "mount /dev/sdb /mnt/key 2>/dev/null", "mount /dev/sdb1 /mnt/key 2>/dev/null"));
}

TEST(MountDeviceTest, OnlyAResultOfZeroIsASuccess) {
  for (int const result : {-1, 1, kFails, 32 << 8, 127 << 8, 9}) {
    SCOPED_TRACE(result);
    TFakeShell const shell({}, result);
    EXPECT_STATUS(TOSSpecific::MountDevice("/dev/fd1"), kZEPStatusFileSystemError);
    EXPECT_THAT(shell.Commands(), ElementsAre(kFloppyIsMounted, "mount /dev/fd1 /mnt/floppy 2>/dev/null",
                                              "mount /dev/fd11 /mnt/floppy 2>/dev/null"));
  }
}

TEST(MountDeviceTest, ANameIsPutIntoTheCommandUnquoted) {
  TFakeShell const shell({}, kFails);
  EXPECT_STATUS(TOSSpecific::MountDevice("-o ro \"/dev/x y\";"), kZEPStatusFileSystemError);
  EXPECT_THAT(shell.Commands(), ElementsAre(kKeyIsMounted, "mount -o ro \"/dev/x y\"; /mnt/key 2>/dev/null",
                                            "mount -o ro \"/dev/x y\";1 /mnt/key 2>/dev/null"));
}

TEST(MountDeviceTest, NothingIsLogged) {
  EXPECT_THAT(LogOf([] {
                TFakeShell const shell({}, kFails);
                EXPECT_STATUS(TOSSpecific::MountDevice("/dev/sdb"), kZEPStatusFileSystemError);
                EXPECT_STATUS(TOSSpecific::UnmountDevice("/dev/sdb", "/mnt/key"), kZEPStatusFileSystemError);
              }),
              IsEmpty());
}

// ---- UnmountDevice ----

TEST(UnmountDeviceTest, OnlyTheMountPointCounts) {
  TFakeShell const shell({});
  for (char const* device : {"/dev/sdb", "/dev/fd0", "", "nonsense; reboot"}) TOSSpecific::UnmountDevice(device, "/mnt/key");
  TOSSpecific::UnmountDevice("/dev/sdb", "/mnt/floppy");
  TOSSpecific::UnmountDevice("/dev/sdb", "");
  std::string const unmountKey = "umount /mnt/key 2> /dev/null";
  EXPECT_THAT(shell.Commands(), ElementsAre(unmountKey, unmountKey, unmountKey, unmountKey, "umount /mnt/floppy 2> /dev/null",
                                            "umount  2> /dev/null"));
}

TEST(UnmountDeviceTest, AnyResultButZeroThrows) {
  for (int const result : {-1, 1, kFails, 32 << 8}) {
    TFakeShell const shell({}, result);
    EXPECT_STATUS(TOSSpecific::UnmountDevice("/dev/sdb", "/mnt/key"), kZEPStatusFileSystemError);
    EXPECT_THAT(shell.Commands(), ElementsAre("umount /mnt/key 2> /dev/null"));
  }
}

// ---- Programs that stand in for mount, umount and hwinfo, first on PATH ----

class StandInTest : public testing::Test {
protected:
  // Adds a shell script that records its call and then runs the test's commands.
  void Add(std::string const& name, std::string const& body) {
    WriteFile(fDir.Path(name), "#!/bin/sh\necho \"" + name + " $*\" >> " + fDir.Path("calls") + "\n" + body + "\n");
    fs::permissions(fDir.Path(name), fs::perms::all);
  }

  TLines Calls() const {
    TLines calls;
    std::istringstream text(ReadFile(fDir.Path("calls")));
    for (std::string line; std::getline(text, line);) calls.push_back(line);
    return calls;
  }

  TTempDir fDir;
  TEnvironmentGuard const fPath{"PATH", (fDir.Path() + ":/usr/bin:/bin").c_str()};
};

TEST_F(StandInTest, MountIsQueriedAndThenMounts) {
  Add("mount", "if test $# = 0; then echo '/dev/sda1 on / type ext4 (rw)'; else echo complaint >&2; fi");
  EXPECT_EQ(TOSSpecific::MountDevice("/dev/sdb"), "/mnt/key");
  EXPECT_THAT(Calls(), ElementsAre("mount ", "mount /dev/sdb /mnt/key"));
}

TEST_F(StandInTest, AMountedKeyIsFoundInTheListOfMounts) {
  struct TRow {
    char const *fLine, *fDevice;
    bool fIsMounted;
  };
  TRow const rows[] = {
      {"/dev/sdb1 on /mnt/key type vfat (rw)", "/dev/sdc", true},
      {"/dev/sdb1 on /mnt/key type vfat (rw)", "/dev/fd0", false},
      {"/dev/fd0 on /mnt/floppy type vfat (rw)", "/dev/fd0", true},
      {"/dev/fd0 on /mnt/floppy type vfat (rw)", "/dev/sdc", false},
      {"/dev/sdb1 on /mnt/key2 type vfat (rw)", "/dev/sdc", false},
      {"/dev/sdb1 on /media/mnt/key type vfat (rw)", "/dev/sdc", true},  // the end of a longer path is accepted as well
      {"/dev/sdb1 on /mnt/key", "/dev/sdc", false},
  };
  for (TRow const& row : rows) {
    SCOPED_TRACE(row.fLine);
    fs::remove(fDir.Path("calls"));
    Add("mount", std::string("test $# = 0 && echo '") + row.fLine + "' || exit 1");
    if (row.fIsMounted) {
      TOSSpecific::MountDevice(row.fDevice);
      EXPECT_THAT(Calls(), ElementsAre("mount "));
    } else {
      EXPECT_STATUS(TOSSpecific::MountDevice(row.fDevice), kZEPStatusFileSystemError);
      EXPECT_THAT(Calls(), testing::SizeIs(3));
    }
  }
}

TEST_F(StandInTest, ErrorMessagesOfTheCommandsAreSuppressed) {
  Add("mount", "echo complaint >&2; exit 1");
  Add("umount", "echo complaint >&2; exit 1");
  Add("grep", "exit 1");
  fs::create_directory(fDir.Path("seen"));
  std::string const seen = InChild([&] {
    if (::freopen(fDir.Path("seen/errors").c_str(), "w", stderr) == nullptr) return std::string("no file");
    EXPECT_STATUS(TOSSpecific::UnmountDevice("/dev/sdb", "/mnt/key"), kZEPStatusFileSystemError);
    EXPECT_STATUS(TOSSpecific::MountDevice("/dev/sdb"), kZEPStatusFileSystemError);
    return ReadFile(fDir.Path("seen/errors"));
  });
  // Only the output of listing the mounts is not redirected. Kept.
  EXPECT_EQ(seen, "complaint\n");
}

// ---- getxBMCVirtualDevices ----

std::string PathOfSample(std::string const& name) { return TestDataPath("hwinfo/" + name); }

TLines VirtualDevices(int kind, bool keepWhole) {
  TLines devices;
  TOSSpecific::getxBMCVirtualDevices(kind, devices, keepWhole);
  return devices;
}

TEST_F(StandInTest, VirtualDevicesOfRealTexts) {
  Add("hwinfo", "cat " + PathOfSample("${1#--}.txt"));
  struct TRow {
    int fKind;
    char const *fOption, *fWhole, *fCut;
  };
  TRow const rows[] = {
      {0, "--disk", "/dev/sdc (/dev/sg3)", "/dev/sdc"},
      {1, "--cdrom", "/dev/sr1", "/dev/sr1"},  // cut in each case
      {2, "--keyboard", "/dev/input/event4", "/dev/input/event4"},
      {3, "--mouse", "/dev/input/mice (/dev/input/mouse2)", "/dev/input/mice"},
  };
  for (TRow const& row : rows) {
    SCOPED_TRACE(row.fOption);
    fs::remove(fDir.Path("calls"));
    EXPECT_THAT(VirtualDevices(row.fKind, true), ElementsAre(row.fWhole));
    EXPECT_THAT(VirtualDevices(row.fKind, false), ElementsAre(row.fCut));
    std::string const call = std::string("hwinfo ") + row.fOption;
    EXPECT_THAT(Calls(), ElementsAre(call, call));
  }
}

TEST_F(StandInTest, EachKindHasItsHeaderAndMarker) {
  Add("hwinfo", "cat " + fDir.Path("text"));
  char const* const headers[] = {"disk", "cdrom", "keyboard", "mouse"};
  char const* const markers[] = {"Virtual", "0x4012"};
  for (int kind = 0; kind < 4; ++kind)
    for (std::string const header : headers)
      for (std::string const marker : markers) {
        SCOPED_TRACE(std::to_string(kind) + " " + header + " " + marker);
        WriteFile(fDir.Path("text"),
                  "  Hardware Class: " + header + "\n  Device: " + marker + "\n  Device File: /dev/x (/dev/y)\n");
        bool const isFound = header == headers[kind] && marker == markers[kind == 0 ? 0 : 1];
        EXPECT_EQ(VirtualDevices(kind, false), isFound ? TLines{"/dev/x"} : TLines{});
      }
}

TEST_F(StandInTest, VirtualDevicesAreAppendedInTheOrderOfTheOutput) {
  WriteFile(fDir.Path("text"),
            "Hardware Class: disk\nModel: Virtual A\nDevice File: /dev/sdd (/dev/sg3)\n\n"
            "Hardware Class: disk\nModel: Real\nDevice File: /dev/sda (/dev/sg0)\n\n"
            "Hardware Class: disk\nModel: Virtual B\nDevice File: /dev/sdb\n");
  Add("hwinfo", "cat " + fDir.Path("text"));
  TLines devices = {"old"};
  TOSSpecific::getxBMCVirtualDevices(0, devices, true);
  TOSSpecific::getxBMCVirtualDevices(0, devices, false);
  EXPECT_THAT(devices, ElementsAre("old", "/dev/sdd (/dev/sg3)", "/dev/sdb", "/dev/sdd", "/dev/sdb"));
}

TEST_F(StandInTest, ABlockWithoutDeviceFileGivesNothing) {
  Add("hwinfo",
      "echo 'Hardware Class: cdrom'; echo 'Device: usb 0x4012'; echo; echo 'Hardware Class: cdrom'; echo 'Device File: "
      "/dev/sr0'");
  EXPECT_THAT(VirtualDevices(1, false), IsEmpty());
  Add("hwinfo", "echo 'Hardware Class: cdrom'; echo 'Device: usb 0x4012'; echo 'Device File: (/dev/sg1)'");
  EXPECT_THAT(VirtualDevices(1, false), IsEmpty());
}

TEST_F(StandInTest, AnUnknownKindRunsNothing) {
  Add("hwinfo", "cat " + PathOfSample("disk.txt"));
  for (int const kind : {-1, 4, 5, 1000, INT_MIN, INT_MAX}) EXPECT_THAT(VirtualDevices(kind, true), IsEmpty()) << kind;
  EXPECT_THAT(Calls(), IsEmpty());
}

TEST_F(StandInTest, TheOutputOfHwinfoCountsWhateverItsResult) {
  Add("hwinfo", "cat " + PathOfSample("disk.txt") + "; exit 3");
  EXPECT_THAT(VirtualDevices(0, false), ElementsAre("/dev/sdc"));
  Add("hwinfo", "cat " + PathOfSample("disk.txt") + " >&2; kill -9 $$");
  EXPECT_THAT(VirtualDevices(0, false), ElementsAre("/dev/sdc"));
}

TEST(VirtualDevicesTest, WithoutHwinfoThereAreNone) {
  TTempDir const empty;
  TEnvironmentGuard const path("PATH", empty.Path().c_str());
  for (int kind = 0; kind < 4; ++kind) EXPECT_THAT(VirtualDevices(kind, true), IsEmpty());
}

TEST_F(StandInTest, OnlyTheSpawningIsLogged) {
  Add("hwinfo", "cat " + PathOfSample("disk.txt"));
  EXPECT_THAT(LogOf([] { VirtualDevices(0, true); }), ElementsAre("[Debug] SpawnProcess: process hwinfo"));
}

TEST_F(StandInTest, AHangingHwinfoIsAbandonedAfterThreeHundredSecondsOfSilence) {
  Add("hwinfo", "echo $$ > " + fDir.Path("pid") + "; cat " + PathOfSample("disk.txt") + "; exec sleep 60");
  TFastSelect const time;
  TLines devices;
  TLines const log = LogOf([&] { devices = VirtualDevices(0, false); });
  EXPECT_THAT(devices, ElementsAre("/dev/sdc"));
  EXPECT_THAT(time.Seconds(), testing::Each(300));
  EXPECT_THAT(log, ElementsAre("[Debug] SpawnProcess: process hwinfo", "[Debug] ERROR: SpawnProcess - hwinfo TimeOut!"));
  pid_t const child = std::stoi(ReadFile(fDir.Path("pid")));
  EXPECT_EQ(::waitpid(child, nullptr, WNOHANG), 0);  // it still runs
  ::kill(child, SIGKILL);
  EXPECT_EQ(::waitpid(child, nullptr, 0), child);
}

// ---- EnumerateRemovableMedia ----

// A namespace with SCSI devices.
class TScsiNamespace {
public:
  TScsiNamespace() : fClass(fNamespace->Add("QRVSG_SCSIDevice")) {}

  boost::shared_ptr<TFakeInstance> Add(char const* type, char const* product, char const* id, char const* vendor) {
    auto const instance = fClass.AddInstance();
    instance->Add("DeviceType", TCIMValue(type));
    instance->Add("ProductID", TCIMValue(product));
    instance->Add("DeviceID", TCIMValue(id));
    instance->Add("VendorID", TCIMValue(vendor));
    return instance;
  }
  boost::shared_ptr<TFakeInstance> AddDisk(char const* id) { return Add("Direct Access Device", "Stick", id, "Maker"); }

  boost::shared_ptr<TFakeNamespace> Get() const { return fNamespace; }

private:
  boost::shared_ptr<TFakeNamespace> fNamespace = boost::make_shared<TFakeNamespace>();
  TFakeClass& fClass;
};

// For use in a child: covers the paths that are read with empty file systems, which only the child sees.
class TFakeMachine {
public:
  TFakeMachine() {
    for (char const* place : {"/sys/kernel/debug", "/sys/class/block", "/proc/bus", "/mnt", "/dev"})
      if (!MountTmpfs(place, "")) throw std::runtime_error(std::string("cannot mount at ") + place);
    fs::create_directory("/mnt/key");
  }

  // A disk's node and its entry in sysfs, with the USB device `usb` ("busnum/devnum") above it, if any.
  void AddDisk(std::string const& name, std::string const& address, std::string const& usb) {
    AddNode(name, address);
    std::string const place = "/sys/class/block/devices/" + name;
    fs::create_directories(place + "/usb/interface/host/target/device");
    fs::create_directories("/sys/class/block/" + name);
    fs::create_directory_symlink(place + "/usb/interface/host/target/device", "/sys/class/block/" + name + "/device");
    if (usb.empty()) return;
    WriteFile(place + "/usb/busnum", usb.substr(0, usb.find('/')) + "\n");
    WriteFile(place + "/usb/devnum", usb.substr(usb.find('/') + 1) + "\n");
  }
  void AddNode(std::string const& name, std::string const& contents) { WriteFile("/dev/" + name, contents); }

  // The kernel's list of USB devices, in its old or its new place.
  void AddUsbList(std::string const& place, std::string const& text) {
    fs::create_directories(place);
    WriteFile(place + "/devices", text);
  }
  void AddRealUsbList() { AddUsbList(kNewPlace, ReadFile(PathOfSample("usb-devices.txt"))); }

  static constexpr char const* kOldPlace = "/proc/bus/usb";
  static constexpr char const* kNewPlace = "/sys/kernel/debug/usb";

private:
  TFakeScsi fScsi;
};

std::string TextOf(std::vector<TRemovableMedium> const& media) {
  std::string text;
  for (TRemovableMedium const& medium : media)
    text += medium.fDevice + "|" + medium.fDescription + "|" + medium.fMountPoint + "\n";
  return text;
}

std::string Enumerate(TScsiNamespace const& ns) { return TextOf(TOSSpecific::EnumerateRemovableMedia(ns.Get())); }

// The disks of tests/data/hwinfo: a SCSI disk, a USB stick, the controller's virtual disk.
void AddRealDisks(TFakeMachine& machine) {
  machine.AddDisk("sda", "0 0 0 0", "");
  machine.AddDisk("sdb", "1 0 0 0", "2/2");
  machine.AddDisk("sdc", "2 0 0 0", "3/2");
}

#define NEEDS_MOUNTS() NEEDS(MayMount(), "only root may mount")

TEST(EnumerateRemovableMediaTest, FindsAndMountsTheUsbDisks) {
  NEEDS_MOUNTS();
  EXPECT_EQ(InChild([] {
              TFakeMachine machine;
              AddRealDisks(machine);
              machine.AddRealUsbList();
              TScsiNamespace ns;
              ns.Add("Direct Access Device", "HARDDISK", "0:0:0:0", "QEMU");
              ns.Add("CD-ROM Device", "CD-ROM", "0:0:1:0", "QEMU");
              ns.Add("Direct Access Device", "Virtual Disk", "2:0:0:0", "Example");
              ns.Add("Direct Access Device", "HARDDISK", "1:0:0:0", "QEMU");
              TFakeShell const shell({{kKeyIsMounted, kFails}});
              std::string const media = Enumerate(ns);
              return media + Joined(shell.Commands());
            }),
            "/dev/sdc|Example Virtual Disk|/mnt/key\n"
            "/dev/sdb|QEMU HARDDISK|/mnt/key\n"
            "mount | grep \"/mnt/key type\" >/dev/null\n"
            "mount /dev/sdc /mnt/key 2>/dev/null\n"
            "mount | grep \"/mnt/key type\" >/dev/null\n"
            "mount /dev/sdb /mnt/key 2>/dev/null\n");
}

TEST(EnumerateRemovableMediaTest, FurtherDisksGetTheMountPointOfTheFirst) {
  NEEDS_MOUNTS();
  EXPECT_EQ(InChild([] {
              TFakeMachine machine;
              AddRealDisks(machine);
              machine.AddRealUsbList();
              TScsiNamespace ns;
              ns.AddDisk("1:0:0:0");
              ns.AddDisk("2:0:0:0");
              TFakeShell const shell({});  // the key is mounted
              std::string const media = Enumerate(ns);
              return media + Joined(shell.Commands());
            }),
            "/dev/sdb|Maker Stick|/mnt/key\n"
            "/dev/sdc|Maker Stick|/mnt/key\n" +
                kKeyIsMounted + "\n" + kKeyIsMounted + "\n");
}

TEST(EnumerateRemovableMediaTest, AnAddressMayComeFromAGenericNode) {
  NEEDS_MOUNTS();
  EXPECT_EQ(InChild([] {
              TFakeMachine machine;
              AddRealDisks(machine);
              machine.AddRealUsbList();
              machine.AddNode("sg2", "generic 1 0 0 0");
              machine.AddNode("sg3", "no SCSI");
              TScsiNamespace ns;
              for (char const* id : {"/dev/sg2", "/dev/sg3", "/dev/sg4", "/dev/sdb", "sg2"}) ns.AddDisk(id);
              TFakeShell const shell({});
              std::string media;
              TLines log = LogOf([&] { media = Enumerate(ns); });
              return media + Joined(TLines(log.end() - 6, log.end()));
            }),
            "/dev/sdb|Maker Stick|/mnt/key\n"
            "[Debug] Failed ioctl on /dev/sg3\n"
            "[Debug] No mapping found for Maker - Stick - /dev/sg3\n"
            "[Debug] Failed opening /dev/sg4\n"
            "[Debug] No mapping found for Maker - Stick - /dev/sg4\n"
            "[Debug] No mapping found for Maker - Stick - /dev/sdb\n"
            "[Debug] No mapping found for Maker - Stick - sg2\n");
}

TEST(EnumerateRemovableMediaTest, EveryNumberOfTheAddressCounts) {
  NEEDS_MOUNTS();
  EXPECT_EQ(InChild([] {
              TFakeMachine machine;
              machine.AddRealUsbList();
              machine.AddDisk("sdb", "4 3 2 1", "2/2");
              machine.AddDisk("sdz", "260 255 254 253", "2/2");
              TScsiNamespace ns;
              for (char const* id : {"4:3:2:1", "5:3:2:1", "4:4:2:1", "4:3:3:1", "4:3:2:2", "4:3:2", "260:255:254:253", ""})
                ns.AddDisk(id);
              TFakeShell const shell({});
              return Enumerate(ns);
            }),
            "/dev/sdb|Maker Stick|/mnt/key\n/dev/sdz|Maker Stick|/mnt/key\n");
}

TEST(EnumerateRemovableMediaTest, NodesAreQueriedInTheOrderOfTheirLetters) {
  NEEDS_MOUNTS();
  std::string expected;
  for (char letter = 'a'; letter <= 'z'; ++letter) {
    bool const isThere = letter == 'b' || letter == 'c' || letter == 'd';
    if (letter == 'c' || letter == 'd') expected += std::string("[Debug] Failed ioctl on /dev/sd") + letter + "\n";
    if (!isThere) expected += std::string("[Debug] Failed opening /dev/sd") + letter + "\n";
  }
  EXPECT_EQ(InChild([] {
              TFakeMachine machine;
              machine.AddUsbList(TFakeMachine::kOldPlace, "U");
              machine.AddDisk("sdb", "1 0 0 0", "2/2");
              machine.AddNode("sdc", "no disk");
              machine.AddNode("sdd", "disk without host");
              machine.AddNode("sdaa", "1 0 0 0");
              TScsiNamespace ns;
              ns.AddDisk("9:0:0:0");
              return Joined(LogOf([&] { Enumerate(ns); }));
            }),
            "[Debug] Debug (linux toss): GetFileContents() Returned: U\n" + expected +
                "[Debug] No mapping found for Maker - Stick - 9:0:0:0\n");
}

TEST(EnumerateRemovableMediaTest, TheListOfUsbDevicesIsReadFirstAndInTwoPlaces) {
  NEEDS_MOUNTS();
  constexpr char const* kOldIsMissing = "[Error] ERROR: CaptureFile failed to open: /proc/bus/usb/devices\n";
  constexpr char const* kNewIsMissing = "[Error] ERROR: CaptureFile failed to open: /sys/kernel/debug/usb/devices\n";
  std::string const returned = "[Debug] Debug (linux toss): GetFileContents() Returned: ";
  struct TRow {
    bool fIsOld, fIsNew;
    std::string fLog;
  };
  TRow const rows[] = {
      {true, false, returned + "old\n"},
      {true, true, returned + "old\n"},
      {false, true, kOldIsMissing + returned + "new\n"},
      {false, false, std::string(kOldIsMissing) + kNewIsMissing},
  };
  for (TRow const& row : rows) {
    SCOPED_TRACE(row.fLog);
    EXPECT_EQ(InChild([&] {
                TFakeMachine machine;
                if (row.fIsOld) machine.AddUsbList(TFakeMachine::kOldPlace, "old");
                if (row.fIsNew) machine.AddUsbList(TFakeMachine::kNewPlace, "new");
                return Joined(LogOf([] {
                  EXPECT_STATUS(TOSSpecific::EnumerateRemovableMedia(boost::make_shared<TFakeNamespace>()), kZEPStatusNotFound);
                }));
              }),
              row.fLog);
  }
}

// It opens, but every read fails.
TEST(EnumerateRemovableMediaTest, AListThatCannotBeReadIsNone) {
  NEEDS_MOUNTS();
  EXPECT_EQ(InChild([] {
              TFakeMachine machine;
              fs::create_directories(std::string(TFakeMachine::kOldPlace) + "/devices");
              machine.AddUsbList(TFakeMachine::kNewPlace, "S:  Product=USB Key\n");
              machine.AddNode("sdb", "1 0 0 0");
              TScsiNamespace ns;
              ns.AddDisk("1:0:0:0");
              TFakeShell const shell({});
              std::string media;
              TLines const log = LogOf([&] { media = Enumerate(ns); });
              return Joined(TLines(log.begin(), log.begin() + 3)) + media;
            }),
            "[Status] GetFileContents failed to read file /proc/bus/usb/devices\n"
            "[Debug] Debug (linux toss): GetFileContents() Returned: S:  Product=USB Key\n\n"
            "[Debug] Failed opening /dev/sda\n"
            "/dev/sdb|Maker Stick|/mnt/key\n");
}

TEST(EnumerateRemovableMediaTest, OnlyADiskInTheListIsAUsbDisk) {
  NEEDS_MOUNTS();
  std::string const list = "T:  Bus=02 Lev=01 Dev#=  2\nS:  Product=Key\n";
  struct TRow {
    std::string fUsb;   // the USB device above the disk in sysfs; "-" when sysfs does not list the disk
    std::string fList;  // empty: there is none
    bool fIsFound;
  };
  TRow const rows[] = {
      {"2/2", list, true},
      {"2/3", list, false},  // it appeared after the list was read
      {"3/2", list, false},
      {"", list, false},
      {"", list + "USB", false},
      {"2/2", "", true},  // sysfs alone decides
      {"", "", false},
      {"-", list, false},
      {"-", list + "S:  Product=USB Key\n", true},
      {"-", list + "Driver=usb-storage\n", false},
      {"-", "", false},
  };
  for (TRow const& row : rows) {
    SCOPED_TRACE(row.fUsb + " " + row.fList);
    EXPECT_EQ(InChild([&] {
                TFakeMachine machine;
                if (row.fUsb == "-")
                  machine.AddNode("sdb", "1 0 0 0");
                else
                  machine.AddDisk("sdb", "1 0 0 0", row.fUsb);
                if (!row.fList.empty()) machine.AddUsbList(TFakeMachine::kNewPlace, row.fList);
                TScsiNamespace ns;
                ns.AddDisk("1:0:0:0");
                TFakeShell const shell({});
                return Enumerate(ns);
              }),
              row.fIsFound ? "/dev/sdb|Maker Stick|/mnt/key\n" : "");
  }
}

TEST(EnumerateRemovableMediaTest, FourPropertiesOfEachInstanceAreReadInOrderWithAnEmptyContext) {
  NEEDS_MOUNTS();
  EXPECT_EQ(InChild([] {
              TFakeMachine const machine;
              TScsiNamespace ns;
              auto const disk = ns.AddDisk("1:0:0:0");
              auto const scanner = ns.Add("Scanner Device", "Scanner", "2:0:0:0", "Maker");
              TFakeShell const shell({});
              TOSSpecific::EnumerateRemovableMedia(ns.Get());
              EXPECT_THAT(ns.Get()->fCalls.fNames, ElementsAre("QRVSG_SCSIDevice"));
              EXPECT_THAT(disk->fCalls.fNames, ElementsAre("DeviceType", "ProductID", "DeviceID", "VendorID"));
              EXPECT_THAT(scanner->fCalls.fNames, ElementsAre("DeviceType", "ProductID", "DeviceID", "VendorID"));
              for (auto const* calls : {&ns.Get()->fCalls, &disk->fCalls, &ns.Get()->Class("QRVSG_SCSIDevice")->fCalls})
                EXPECT_THAT(calls->fContexts, testing::Each(IsEmpty()));
              return "done";
            }),
            "done");
}

TEST(EnumerateRemovableMediaTest, OnlyDirectAccessDevicesAreDisks) {
  NEEDS_MOUNTS();
  EXPECT_EQ(InChild([] {
              TFakeMachine machine;
              machine.AddDisk("sdb", "1 0 0 0", "2/2");
              TScsiNamespace ns;
              for (char const* type :
                   {"CD-ROM Device", "direct access device", "Direct Access Device ", "Simplified Direct Access Device", ""})
                ns.Add(type, type, "1:0:0:0", "Maker");
              ns.Add("Direct Access Device", "the one", "1:0:0:0", "Maker");
              TFakeShell const shell({});
              return Enumerate(ns);
            }),
            "/dev/sdb|Maker the one|/mnt/key\n");
}

TEST(EnumerateRemovableMediaTest, AMissingOrNullPropertyIsEmpty) {
  NEEDS_MOUNTS();
  EXPECT_EQ(InChild([] {
              TFakeMachine const machine;
              auto const ns = boost::make_shared<TFakeNamespace>();
              TFakeClass& cls = ns->Add("QRVSG_SCSIDevice");
              cls.AddInstance();  // without properties
              cls.AddInstance()->Add("DeviceType", TCIMValue(TCIMValue::TCIMType::kCIMTypeString, 0));
              auto const disk = cls.AddInstance();
              disk->Add("DeviceType", TCIMValue("Direct Access Device"));
              disk->Add("VendorID", TCIMValue(TCIMValue::TCIMType::kCIMTypeString, 0));
              std::string media;
              TLines log = LogOf([&] { media = TextOf(TOSSpecific::EnumerateRemovableMedia(ns)); });
              auto const isOther = [](std::string const& line) { return line.find("No mapping") == line.npos; };
              log.erase(std::remove_if(log.begin(), log.end(), isOther), log.end());
              return media + Joined(log);
            }),
            "[Debug] No mapping found for  -  - \n");
}

TEST(EnumerateRemovableMediaTest, ExceptionsOfTheNamespacePassThrough) {
  EXPECT_STATUS(TOSSpecific::EnumerateRemovableMedia(boost::make_shared<TFakeNamespace>()), kZEPStatusNotFound);
  TScsiNamespace ns;
  auto const disk = ns.AddDisk("1:0:0:0");
  disk->fCalls.fFailure = kZEPStatusAccessDenied;
  EXPECT_STATUS(TOSSpecific::EnumerateRemovableMedia(ns.Get()), kZEPStatusAccessDenied);
  disk->fCalls.fFailure.reset();
  disk->Add("DeviceID", TCIMValue(7));
  EXPECT_STATUS(TOSSpecific::EnumerateRemovableMedia(ns.Get()), kZEPStatusTypeMismatch);
}

TEST(EnumerateRemovableMediaTest, DescriptionIsVendorAndProduct) {
  NEEDS_MOUNTS();
  EXPECT_EQ(InChild([] {
              TFakeMachine machine;
              machine.AddDisk("sdb", "1 0 0 0", "2/2");
              TScsiNamespace ns;
              ns.Add("Direct Access Device", "Disk", "1:0:0:0", "");
              ns.Add("Direct Access Device", "", "1:0:0:0", "Maker");
              ns.Add("Direct Access Device", "", "1:0:0:0", "");
              TFakeShell const shell({});
              return Enumerate(ns);
            }),
            "/dev/sdb|Disk|/mnt/key\n/dev/sdb|Maker|/mnt/key\n/dev/sdb||/mnt/key\n");
}

TEST(EnumerateRemovableMediaTest, TheMountDirectoryIsMadeWhenItIsMissing) {
  NEEDS_MOUNTS();
  EXPECT_EQ(InChild([] {
              TFakeMachine machine;
              fs::remove("/mnt/key");
              machine.AddDisk("sdb", "1 0 0 0", "2/2");
              TScsiNamespace ns;
              TFakeShell const shell({});
              Enumerate(ns);
              std::string const withoutMedia = fs::exists("/mnt/key") ? "there " : "missing ";
              ns.AddDisk("1:0:0:0");
              std::string const media = Enumerate(ns);
              return withoutMedia + media + (fs::is_directory("/mnt/key") ? "there" : "missing");
            }),
            "missing /dev/sdb|Maker Stick|/mnt/key\nthere");
}

TEST(EnumerateRemovableMediaTest, AMediumThatCannotBeMountedHasNoMountPoint) {
  NEEDS_MOUNTS();
  EXPECT_EQ(InChild([] {
              TFakeMachine machine;
              AddRealDisks(machine);
              TScsiNamespace ns;
              ns.AddDisk("1:0:0:0");
              ns.AddDisk("2:0:0:0");
              TFakeShell const shell({{"mount /dev/sdc /mnt/key 2>/dev/null", 0}}, kFails);
              std::string media;
              TLines const log = LogOf([&] { media = Enumerate(ns); });
              return media + log.back() + "\n";
            }),
            "/dev/sdb|Maker Stick|\n"
            "/dev/sdc|Maker Stick|/mnt/key\n"
            "[Debug] Failed mounting /dev/sdb: kZEPStatusFileSystemError\n");
}

TEST(EnumerateRemovableMediaTest, AMountDirectoryThatCannotBeMadeStopsNothing) {
  NEEDS_MOUNTS();
  EXPECT_EQ(InChild([] {
              TFakeMachine machine;
              machine.AddDisk("sdb", "1 0 0 0", "2/2");
              fs::remove("/mnt/key");
              WriteFile("/mnt/key", "");
              TScsiNamespace ns;
              ns.AddDisk("1:0:0:0");
              TFakeShell const shell({});
              std::string media;
              TLines const log = LogOf([&] { media = Enumerate(ns); });
              return media + log.back() + "\n" + Joined(shell.Commands());
            }),
            "/dev/sdb|Maker Stick|\n"
            "[Debug] Failed mounting /dev/sdb: kZEPStatusDirectoryAlreadyExists\n");
}

TEST(EnumerateRemovableMediaTest, TheFloppyDriveComesLastUnmountedAndOnce) {
  NEEDS_MOUNTS();
  struct TRow {
    TLines fNodes;
    std::string fMedia;
  };
  TRow const rows[] = {
      {{}, ""},
      {{"fd0"}, "/dev/fd0|Built-in Floppy Drive|/mnt/floppy\n"},
      {{"fd1"}, "/dev/fd1|Built-in Floppy Drive|/mnt/floppy\n"},
      {{"fd0", "fd1"}, "/dev/fd0|Built-in Floppy Drive|/mnt/floppy\n"},
      {{"fd0", "floppy"}, "/dev/floppy|Built-in Floppy Drive|/mnt/floppy\n"},
      {{"fd2"}, ""},
  };
  for (TRow const& row : rows)
    EXPECT_EQ(InChild([&] {
                TFakeMachine machine;
                machine.AddDisk("sdb", "1 0 0 0", "2/2");
                for (std::string const& node : row.fNodes) machine.AddNode(node, "");
                TScsiNamespace ns;
                ns.AddDisk("1:0:0:0");
                TFakeShell const shell({});
                std::string const media = Enumerate(ns);
                return media + Joined(shell.Commands());
              }),
              "/dev/sdb|Maker Stick|/mnt/key\n" + row.fMedia + kKeyIsMounted + "\n");
}

TEST(EnumerateRemovableMediaTest, NoDescriptorStaysOpen) {
  NEEDS_MOUNTS();
  EXPECT_EQ(InChild([] {
              TFakeMachine machine;
              AddRealDisks(machine);
              machine.AddNode("sdd", "no disk");
              TScsiNamespace ns;
              ns.AddDisk("1:0:0:0");
              ns.AddDisk("/dev/sg0");
              machine.AddNode("sg0", "no disk");
              TFakeShell const shell({});
              int const before = OpenDescriptors();
              Enumerate(ns);
              return std::to_string(OpenDescriptors() - before);
            }),
            "0");
}

}  // namespace
}  // namespace NQRVZEP20
