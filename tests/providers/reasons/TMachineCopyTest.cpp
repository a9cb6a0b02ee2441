// SPDX-License-Identifier: Apache-2.0
#include "TMachineCopy.h"

#include "TMachineFiles.h"
#include "tests/Support.h"

#include <gmock/gmock.h>
#include <sys/resource.h>
#include <sys/stat.h>

#include <csignal>

namespace NQRVZEP20 {
namespace {

namespace fs = std::filesystem;

using testing::ElementsAre;
using testing::IsEmpty;

// A small machine, which TMachineFiles records while it reads, and what it then reads in the recording alone.
class TMachineCopyTest : public testing::Test {
protected:
  TMachineCopyTest() {
    fs::create_directories(fMachine.Path("sys/devices/eth0"));
    fs::create_directories(fMachine.Path("sys/class/net"));
    fs::create_directory_symlink("../../devices/eth0", fMachine.Path("sys/class/net/eth0"));
    fs::create_directory_symlink("/sys/class", fMachine.Path("classes"));
    Write("sys/devices/eth0/mtu", "1500\n");
    Write("sys/devices/eth0/speed", "1000\n");
    Write("config", "0123456789");
    ::mkfifo(fMachine.Path("pipe").c_str(), 0600);
  }

  void Write(std::string const& name, std::string const& text) { WriteFile(fMachine.Path(name), text); }

  TMachineFiles Recording() {
    TEnvironmentGuard const from("ZEP_RECORD_FROM", fMachine.Path().c_str());
    TEnvironmentGuard const root("ZEP_ROOT", fCopy.Path().c_str());
    return TMachineFiles::OfThisProcess();
  }
  TMachineFiles Replayed() { return TMachineFiles(fCopy.Path()); }

  static std::string Text(TFinding<std::string> const& found) { return found ? *found : "<" + found.Why().fReason + ">"; }

  TTempDir fMachine, fCopy;
};

TEST_F(TMachineCopyTest, FilesAreReadInTheRecordingAsOnTheMachine) {
  TMachineFiles const files = Recording();
  EXPECT_TRUE(files.IsBeingRecorded());
  for (TMachineFiles const& from : {files, Replayed()}) {
    EXPECT_EQ(Text(from.Line("/classes/net/eth0/mtu")), "1500");
    EXPECT_EQ(Text(from.RealPath("/classes/net/eth0")), "/sys/devices/eth0");
    EXPECT_EQ(Text(from.Content("/none")), "</none does not exist>");
    EXPECT_EQ(Text(from.Content("/pipe")), "</pipe is not a regular file>");
    EXPECT_THAT(from.Names("/sys/class/net"), ElementsAre("eth0"));
    EXPECT_THAT(from.Names("/none"), IsEmpty());
    EXPECT_TRUE(from.Exists("/config"));
    EXPECT_FALSE(from.Exists("/none"));
  }
}

TEST_F(TMachineCopyTest, AFileThatWasReadIsNotReadAgain) {
  TMachineFiles const files = Recording();
  EXPECT_EQ(Text(files.Line("/sys/class/net/eth0/mtu")), "1500");
  Write("sys/devices/eth0/mtu", "9000\n");
  EXPECT_EQ(Text(files.Line("/sys/devices/eth0/mtu")), "1500");
  EXPECT_EQ(Text(Recording().Line("/sys/class/net/eth0/mtu")), "1500");
}

TEST_F(TMachineCopyTest, PartsOfAFileComeTogether) {
  TMachineFiles const files = Recording();
  files.Bytes("/config", 6, 2);
  files.Bytes("/config", 0, 3);
  files.Bytes("/config", 20, 3);
  EXPECT_EQ(Text(Replayed().Bytes("/config", 6, 2)), "67");
  EXPECT_EQ(Text(Replayed().Bytes("/config", 0, 3)), "012");
  EXPECT_EQ(Text(Replayed().Bytes("/config", 20, 3)), "");
}

TEST_F(TMachineCopyTest, AFileThatWasOnlyListedIsNotReadAsEmpty) {
  EXPECT_THAT(Recording().Names("/sys/devices/eth0"), ElementsAre("mtu", "speed"));
  EXPECT_THAT(Replayed().Names("/sys/devices/eth0"), ElementsAre("mtu", "speed"));
  EXPECT_EQ(Text(Replayed().Content("/sys/devices/eth0/speed")),
            "</sys/devices/eth0/speed was listed when this machine was recorded, but not read>");
  EXPECT_EQ(Text(Recording().Content("/sys/devices/eth0/speed")), "1000\n");
  EXPECT_EQ(Text(Replayed().Content("/sys/devices/eth0/speed")), "1000\n");
}

// The user who recorded was not root; the user who replays may be.
TEST_F(TMachineCopyTest, ARefusalIsGivenAgain) {
  Write("refused", "refused 13 user");
  ::chmod(fMachine.Path("refused").c_str(), 01400);
  Write("failed", "refused 5 root");
  ::chmod(fMachine.Path("failed").c_str(), 01400);
  for (TMachineFiles const& files : {Recording(), Replayed()}) {
    EXPECT_EQ(Text(files.Content("/refused")), "<only root may read /refused>");
    EXPECT_EQ(Text(files.Bytes("/failed", 7, 1)), "</failed cannot be read: Input/output error>");
  }
}

TEST_F(TMachineCopyTest, AnAnswerIsRecordedWithTheReasonWhyItIsMissing) {
  TEnvironmentGuard const from("ZEP_RECORD_FROM", "/");
  TEnvironmentGuard const root("ZEP_ROOT", fCopy.Path().c_str());
  TMachineFiles const files = TMachineFiles::OfThisProcess();
  EXPECT_TRUE(files.IsThisMachine());
  EXPECT_FALSE(files.HasAnswer("tool/sda"));
  files.Answer("tool/sda", [] { return std::string("healthy"); });
  files.Answer("tool/sdb", []() -> TFinding<std::string> { return TMissing{"no-tool", "the tool  is missing"}; });
  auto const ask = []() -> TFinding<std::string> { return std::string("asked again"); };
  EXPECT_EQ(Text(Replayed().Answer("tool/sda", ask)), "healthy");
  EXPECT_EQ(Text(Replayed().Answer("tool/sdb", ask)), "<the tool  is missing>");
  EXPECT_EQ(Replayed().Answer("tool/sdb", ask).Why().fCode, "no-tool");
  EXPECT_TRUE(Replayed().HasAnswer("tool/sdb"));
}

TEST_F(TMachineCopyTest, TheDirectoryOfTheReadingProcessIsCopiedUnderOneName) {
  TMachineFiles const machine("/");
  TEnvironmentGuard const from("ZEP_RECORD_FROM", "/");
  TEnvironmentGuard const root("ZEP_ROOT", fCopy.Path().c_str());
  std::string const mounts = Text(TMachineFiles::OfThisProcess().Content("/proc/mounts"));
  EXPECT_EQ(Text(Replayed().Content("/proc/mounts")), mounts);
  EXPECT_TRUE(fs::is_directory(fs::symlink_status(fCopy.Path("proc/self"))));
}

// The parent of the root is the root.
TEST_F(TMachineCopyTest, ALinkThatLeadsAboveTheRootStaysWithinIt) {
  fs::create_directories(fMachine.Path("etc"));
  fs::create_symlink("../../../config", fMachine.Path("etc/above"));
  fs::create_symlink("../config", fMachine.Path("etc/beside"));
  fs::create_symlink("/../../config", fMachine.Path("etc/absolute"));
  fs::create_symlink("../..", fMachine.Path("etc/root"));
  TMachineFiles const files = Recording();
  for (char const* name : {"above", "beside", "absolute", "root/config"}) {
    EXPECT_EQ(Text(files.Content(std::string("/etc/") + name)), "0123456789") << name;
    EXPECT_EQ(Text(Replayed().Content(std::string("/etc/") + name)), "0123456789") << name;
  }
  EXPECT_EQ(fs::read_symlink(fCopy.Path("etc/above")), "../config");
  EXPECT_EQ(fs::read_symlink(fCopy.Path("etc/beside")), "../config");
  EXPECT_EQ(fs::read_symlink(fCopy.Path("etc/absolute")), "../config");
  EXPECT_EQ(fs::read_symlink(fCopy.Path("etc/root")), "..");
}

TEST_F(TMachineCopyTest, TheReadingLibraryIsNoted) {
  Recording();
  EXPECT_TRUE(fs::exists(fCopy.Path("zep-plug-ins/reasons_tests")));
}

// Not even files of a few bytes can be written while an object exists.
class TFullDisk {
public:
  TFullDisk() {
    ::getrlimit(RLIMIT_FSIZE, &fBefore);
    rlimit const full = {3, fBefore.rlim_max};
    ::setrlimit(RLIMIT_FSIZE, &full);
  }
  ~TFullDisk() {
    ::setrlimit(RLIMIT_FSIZE, &fBefore);
    std::signal(SIGXFSZ, fHandler);
  }

private:
  rlimit fBefore = {};
  void (*fHandler)(int) = std::signal(SIGXFSZ, SIG_IGN);
};

TEST_F(TMachineCopyTest, ALossIsNoted) {
  fs::path const note = fCopy.Path("zep-plug-ins/reasons_tests");
  auto const isWritable = [&] { return (fs::status(note).permissions() & fs::perms::owner_write) != fs::perms::none; };
  TMachineFiles const files = Recording();
  EXPECT_EQ(Text(files.Line("/sys/class/net/eth0/mtu")), "1500");
  EXPECT_FALSE(isWritable());
  {
    TFullDisk const full;
    EXPECT_EQ(Text(files.Content("/config")), "</config does not exist>");
  }
  EXPECT_TRUE(isWritable());
  Recording();
  EXPECT_TRUE(isWritable());
}

}  // namespace
}  // namespace NQRVZEP20
