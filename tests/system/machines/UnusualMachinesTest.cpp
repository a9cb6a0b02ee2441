// SPDX-License-Identifier: Apache-2.0

// zep report with all providers of this project, on recorded machines that lack something or contain hostile texts.

#include "tests/Machines.h"
#include "tests/providers/controller/ControllerBytes.h"
#include "tests/tools/zep/Zep.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <sched.h>
#include <sys/mount.h>

#include <algorithm>
#include <cstdio>
#include <regex>
#include <set>

namespace NQRVZEP20::zep {
namespace {

using testing::AnyOf;
using testing::HasSubstr;
using testing::IsEmpty;
using testing::Not;

constexpr int kIncomplete = 2;  // the exit status when the serial number or the like is unknown

// Sequences that control a terminal, markup, quotes, bytes that are not UTF-8, and a character that reverses the writing
// direction.
constexpr char kHostile[] = "X\x1b]0;title\x07\x1b[31m\x9b\x33\x31m<b a='1'>&amp;\"$(id)`id`%s%n\\\xff\xfe\xc3\x28\xe2\x80\xae";

// The files of sysfs whose content is text of a device.
std::set<std::string> const kTextFiles = {"model", "vendor",       "serial",      "product",     "manufacturer",
                                          "rev",   "firmware_rev", "firmware_id", "ifalias",     "label",
                                          "name",  "description",  "unique_id",   "wwid",        "subsysnqn",
                                          "mode",  "state",        "interface",   "temp1_label", "dimm_label"};

class UnusualMachinesTest : public testing::Test {
protected:
  UnusualMachinesTest() {
    for (char const* library :
         {"libDevices.nsp.so", "libNetwork.nsp.so", "libStorage.nsp.so", "libSensors.nsp.so", "libController.nsp.so"})
      fInstalled.Add(library, std::string(TEST_LIB_DIR "/") + library);
  }

  TRun Report(std::vector<std::string> const& options) {
    TCall call{{"report", "--plugin-timeout", "60"}, {{"ZEP_ROOT", fMachine.Root()}}};
    call.fArguments.insert(call.fArguments.end(), options.begin(), options.end());
    return fInstalled.Run(call);
  }

  void Remove(std::string const& path) { fs::remove_all(fMachine.Root() + path); }

  void Write(std::string const& path, std::string const& content) {
    fs::create_directories(fs::path(fMachine.Root() + path).parent_path());
    WriteFile(fMachine.Root() + path, content);
  }

  // A memory module with an error counter, and a log of the kernel with errors of a process and of a disk.
  void AddErrors() {
    std::string const module = "/sys/devices/system/edac/mc/mc0/dimm0/dimm_";
    for (char const* file : {"label", "ce_count", "ue_count"}) Write(module + file, "1\n");
    std::string const text = kHostile;
    Write("/dev/kmsg", "3,1,1000000,-;Out of memory: Killed process 158 (" + text +
                           ") total-vm:7048kB\n3,2,1000000,-;I/O error, dev " + text + ", sector 8 op 0x1:(WRITE) " + text +
                           "\n2,3,1000000,-;{1}[Hardware Error]: " + text + "\n");
  }

  // A controller with an account and FRU data that have hostile texts. FRU data are read in parts: first 8 bytes, then up to 32.
  void AddController() {
    std::string const answers = "/zep-answers/ipmi/", text = TextField(kHostile);
    fs::copy(TestDataPath("controller/zep-answers/ipmi"), fMachine.Root() + answers);
    Write(answers + "0642-01", Bytes({0, 1, 4, 1, 0, 0, 0, 0, 0, 0}));
    Write(answers + "0644-0101", Bytes({0, 1, 0x42, 0, 0x14}));
    Write(answers + "0646-01", Bytes({0}) + std::string(kHostile).substr(0, 16));
    std::string const fru = FruDevice(FruArea("\x17", text + text), FruArea(Bytes({25, 0, 0, 0}), text + text + text + text),
                                      FruArea(Bytes({25}), text + text + text));
    Write(answers + "0a10-00", Bytes({0, static_cast<int>(fru.size() & 0xFF), static_cast<int>(fru.size() >> 8), 0}));
    std::size_t length = 8;
    for (std::size_t at = 0; at < fru.size(); at += length, length = std::min<std::size_t>(32, fru.size() - at)) {
      char name[32];
      std::snprintf(name, sizeof name, "0a11-00%02zx%02zx%02zx", at & 0xFF, at >> 8, length);
      Write(answers + name, Bytes({0, static_cast<int>(length)}) + fru.substr(at, length));
    }
  }

  // Replaces the texts that devices, udev and the distribution have written.
  int MakeHostile() {
    int replaced = 0;
    for (auto const& entry : fs::recursive_directory_iterator(fMachine.Root())) {
      if (!entry.is_regular_file() || entry.is_symlink()) continue;
      std::string const path = entry.path().string();
      if (kTextFiles.count(entry.path().filename().string()) > 0)
        WriteFile(path, std::string(kHostile) + "\n");
      else if (path.find("/run/udev/data/") != std::string::npos || path.find("/etc/os-release") != std::string::npos)
        WriteFile(path,
                  std::regex_replace(ReadFile(path), std::regex("(E:ID_MODEL[A-Z_]*|E:ID_FS_LABEL|E:DM_NAME|PRETTY_NAME)=.*"),
                                     "$1=" + std::regex_replace(kHostile, std::regex("\\$"), "$$$$")));
      else
        continue;
      ++replaced;
    }
    return replaced;
  }

  TInstallation fInstalled;
  TRecordedMachine fMachine{"server"};
};

// No control character but line feeds, and valid UTF-8 without the second set of control characters.
void ExpectHarmless(std::string const& text) {
  EXPECT_TRUE(std::all_of(text.begin(), text.end(), [](unsigned char c) { return c == '\n' || (c >= 0x20 && c != 0x7f); }));
  EXPECT_NO_THROW(nlohmann::json(text).dump()) << "not UTF-8";
  EXPECT_FALSE(std::regex_search(text, std::regex("\xc2[\x80-\x9f]|\xe2\x80[\xaa-\xae]")));
}

std::set<std::string> ClassesIn(nlohmann::json const& document) {
  std::set<std::string> classes;
  for (auto const& instance : document["instances"]) classes.insert(instance["class"].get<std::string>());
  return classes;
}

// The values that are missing without a reason, as "class.property".
std::vector<std::string> WithoutReason(nlohmann::json const& document) {
  std::vector<std::string> names;
  for (auto const& instance : document["instances"])
    for (auto const& [name, property] : instance["properties"].items())
      if (property["value"].is_null() && property.value("reason", "").empty())
        names.push_back(instance["class"].get<std::string>() + "." + name);
  return names;
}

void ExpectEveryPlugInWorks(nlohmann::json const& document) {
  EXPECT_EQ(document["plugIns"].size(), 6u);
  for (auto const& plugIn : document["plugIns"]) EXPECT_TRUE(plugIn["error"].is_null()) << plugIn;
}

TEST_F(UnusualMachinesTest, HostileTextsOfDevicesDoNoHarm) {
  AddErrors();
  AddController();
  EXPECT_GT(MakeHostile(), 50);
  for (std::vector<std::string> const& options : {std::vector<std::string>{}, {"--full"}}) {
    TRun const run = Report(options);
    EXPECT_EQ(run.fStatus, 0) << run.fErrors;
    EXPECT_THAT(run.fOutput, HasSubstr("X\\x1b]0;title\\x07\\x1b[31m")) << "the text itself is shown";
    ExpectHarmless(run.fOutput);
    ExpectHarmless(run.fErrors);
  }
  TRun const run = Report({"--json"});
  EXPECT_EQ(run.fStatus, 0);
  auto const document = JsonOf(run);
  ExpectEveryPlugInWorks(document);
  EXPECT_THAT(WithoutReason(document), IsEmpty());
  std::set<std::string> hostile;
  for (auto const& instance : document["instances"])
    if (instance["properties"].dump().find("title\\u0007") != std::string::npos) hostile.insert(instance["class"]);
  for (char const* expected : {"CIM_NumericSensor", "ZEP_MemoryErrors", "ZEP_KernelLogRecord", "CIM_PhysicalPackage"})
    EXPECT_EQ(hostile.count(expected), 1U) << expected;
}

TEST_F(UnusualMachinesTest, AContainerWithoutSysfsHasReasons) {
  Remove("/sys");
  Remove("/run");
  TRun const run = Report({"--json"});
  EXPECT_EQ(run.fStatus, kIncomplete) << run.fErrors;
  auto const document = JsonOf(run);
  ExpectEveryPlugInWorks(document);
  EXPECT_THAT(WithoutReason(document), IsEmpty());
  auto const classes = ClassesIn(document);
  EXPECT_EQ(classes.count("QRVSG_OperatingSystem"), 1u);
  for (char const* absent : {"CIM_DiskDrive", "CIM_PCIDevice", "CIM_Chassis"}) EXPECT_EQ(classes.count(absent), 0u) << absent;
  EXPECT_EQ(Report({}).fStatus, kIncomplete);
}

TEST_F(UnusualMachinesTest, AMachineWithoutSmbiosIsDescribedByTheKernel) {
  Remove("/sys/firmware/dmi");
  Remove("/sys/class/dmi");
  auto const document = JsonOf(Report({"--json"}));
  ExpectEveryPlugInWorks(document);
  EXPECT_THAT(WithoutReason(document), IsEmpty());
  auto const classes = ClassesIn(document);
  for (char const* present : {"CIM_Processor", "CIM_ProcessorCore", "CIM_Memory", "CIM_DiskDrive", "CIM_EthernetPort"})
    EXPECT_EQ(classes.count(present), 1u) << present;
  for (char const* absent : {"CIM_Chassis", "CIM_PhysicalMemory", "CIM_BIOSElement"})
    EXPECT_EQ(classes.count(absent), 0u) << absent;
}

TEST_F(UnusualMachinesTest, DevicesThatVanishAfterTheListingAreOmitted) {
  auto const before = JsonOf(Report({"--json"}));
  // The links that list the devices stay.
  for (std::string const link : {"/sys/class/block/sda", "/sys/bus/pci/devices/0000:04:00.0"}) {
    ASSERT_TRUE(fs::exists(fMachine.Root() + link)) << link;
    fs::remove_all(fs::canonical(fMachine.Root() + link));
  }
  TRun const run = Report({"--json"});
  EXPECT_EQ(run.fStatus, 0) << run.fErrors;
  auto const after = JsonOf(run);
  ExpectEveryPlugInWorks(after);
  EXPECT_THAT(WithoutReason(after), IsEmpty());
  EXPECT_THAT(before.dump(), HasSubstr("DeviceID=\\\"sda\\\""));
  EXPECT_THAT(after.dump(), Not(HasSubstr("CIM_DiskDrive.CreationClassName=\\\"CIM_DiskDrive\\\",DeviceID=\\\"sda\\\"")));
  EXPECT_THAT(after.dump(), HasSubstr("DeviceID=\\\"nvme0n1\\\""));
}

// Makes another machine of this process: without sysfs and the records of udev, and with no network and another name.
bool BecomeAnotherMachine() {
  if (::unshare(CLONE_NEWNS | CLONE_NEWNET | CLONE_NEWUTS) != 0) return false;
  if (::mount("none", "/", nullptr, MS_REC | MS_PRIVATE, nullptr) != 0) return false;
  for (char const* directory : {"/sys", "/run"})
    if (::mount("none", directory, "tmpfs", 0, nullptr) != 0) return false;
  return ::sethostname("elsewhere", 9) == 0;
}

// A container may run as root without the capability.
bool CanMakeNamespaces() {
  pid_t const child = ::fork();
  if (child == 0) ::_exit(::unshare(CLONE_NEWNS) == 0 ? 0 : 1);
  int status = 0;
  return ::waitpid(child, &status, 0) == child && status == 0;
}

TEST_F(UnusualMachinesTest, NothingOfThisMachineIsInTheDescriptionOfAnother) {
  if (!CanMakeNamespaces()) GTEST_SKIP() << "only root with the capability CAP_SYS_ADMIN can make namespaces";
  auto const here = JsonOf(Report({"--json"}));
  pid_t const child = ::fork();
  if (child == 0) ::_exit(BecomeAnotherMachine() ? Report({"--json"}).fStatus : 126);
  int status = 0;
  ASSERT_EQ(::waitpid(child, &status, 0), child);
  ASSERT_EQ(status, 0) << ReadFile(fInstalled.Path("err"));
  auto const elsewhere = nlohmann::json::parse(ReadFile(fInstalled.Path("out")));
  EXPECT_GT(here["instances"].size(), 1000u);
  EXPECT_TRUE(here["instances"] == elsewhere["instances"]) << nlohmann::json::diff(here["instances"], elsewhere["instances"]);
}

// The machine on which the test runs, whatever it is.
TEST_F(UnusualMachinesTest, WithoutRootEveryGapHasAReason) {
  TRun const run = fInstalled.Run({{"report", "--json", "--plugin-timeout", "60"}, {}, true});
  EXPECT_THAT(run.fStatus, AnyOf(0, kIncomplete)) << run.fErrors;
  auto const document = JsonOf(run);
  ExpectEveryPlugInWorks(document);
  EXPECT_THAT(WithoutReason(document), IsEmpty());
  EXPECT_EQ(ClassesIn(document).count("QRVSG_OperatingSystem"), 1u);
}

}  // namespace
}  // namespace NQRVZEP20::zep
