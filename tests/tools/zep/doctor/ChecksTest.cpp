// SPDX-License-Identifier: Apache-2.0
#include "tools/zep/doctor/Checks.h"

#include "platform/include/smbios.h"
#include "tests/Support.h"

#include <gmock/gmock.h>

#include <cerrno>

namespace NQRVZEP20::zep {
namespace {

namespace fs = std::filesystem;

// "works: FINDING" or "FINDING -> REMEDY".
std::string TextOf(TCheck const& check) {
  return check.fWorks ? "works: " + check.fFinding + check.fRemedy : check.fFinding + " -> " + check.fRemedy;
}

TLoadOutcome const kLoaded;
TLoadOutcome const kNotLoaded{TLoadOutcome::kNotLoaded, "cannot open shared object file"};

TEST(ChecksTest, RootIsNeeded) {
  EXPECT_EQ(TextOf(CheckRoot(true)), "works: zep runs as root");
  EXPECT_EQ(TextOf(CheckRoot(false)),
            "zep does not run as root, which the kernel's SMBIOS tables, media and DHCP need -> run zep as root");
}

TEST(ChecksTest, EachStateOfTheSmbiosTablesHasACauseAndARemedy) {
  struct {
    TSmbiosOutcome fOutcome;
    char const* fText;
  } const rows[] = {
      {{kLoaded, kSmbiosOk, 0, ""}, "works: the kernel's tables can be read"},
      {{kLoaded, kSmbiosOk, 0, "/t"}, "works: /t, which ZEP_SMBIOS_TABLE names, can be read"},
      {{kLoaded, kSmbiosFileNotFound, 0, ""},
       "the kernel exports no SMBIOS tables -> name a dump of the tables in ZEP_SMBIOS_TABLE"},
      {{kLoaded, kSmbiosFileNotFound, 0, "/t"},
       "/t, which ZEP_SMBIOS_TABLE names, does not exist -> name another file in ZEP_SMBIOS_TABLE"},
      {{kLoaded, kSmbiosAccessDenied, 0, ""}, "this user may not read the kernel's tables -> run zep as root"},
      {{kLoaded, kSmbiosFileSystemError, EIO, ""},
       "the kernel's tables cannot be read: Input/output error -> name a dump of the tables in ZEP_SMBIOS_TABLE"},
      {{kLoaded, kSmbiosFail, 0, "/t"}, "there is no SMBIOS table in /t -> name another file in ZEP_SMBIOS_TABLE"},
      {{kNotLoaded, 0, 0, ""},
       "libsmbios.so cannot be loaded: cannot open shared object file -> install the package libzepcore1 anew"},
  };
  for (auto const& row : rows) EXPECT_EQ(TextOf(CheckSmbios(row.fOutcome)), row.fText);
}

TEST(ChecksTest, LibcurlIsLoadedOrItsPackageIsNamed) {
  EXPECT_EQ(TextOf(CheckLibcurl(kLoaded)), "works: it can be loaded: send, get and proxy-check work");
  EXPECT_EQ(TextOf(CheckLibcurl(kNotLoaded)),
            "libcurl cannot be loaded: cannot open shared object file -> install the package libcurl4");
  EXPECT_EQ(TextOf(CheckLibcurl({TLoadOutcome::kFunctionMissing, ""})),
            "libcurl lacks a function -> install the package libcurl4");
}

TEST(ChecksTest, AControllerDeviceIsFoundUnderEachOfItsNames) {
  for (char const* name : {"ipmi0", "ipmi/0", "ipmidev/0"}) {
    TTempDir const dir;
    fs::create_directories(fs::path(dir.Path(name)).parent_path());
    WriteFile(dir.Path(name), "");
    EXPECT_EQ(TextOf(CheckControllerDevice(dir.Path())), "works: " + dir.Path(name));
  }
  TTempDir const empty;
  EXPECT_EQ(
      TextOf(CheckControllerDevice(empty.Path())),
      "there is no " + empty.Path("ipmi0") + " -> if this server has a management controller: modprobe ipmi_si ipmi_devintf");
  fs::create_symlink("ipmi0", empty.Path("ipmi0"));
  EXPECT_EQ(TextOf(CheckControllerDevice(empty.Path())),
            empty.Path("ipmi0") + " cannot be used: Too many levels of symbolic links -> run zep as root");
}

TEST(ChecksTest, AProgramIsAnExecutableFileOfPath) {
  TTempDir const dir;
  for (char const* name : {"a", "b", "c"}) fs::create_directory(dir.Path(name));
  WriteFile(dir.Path("a/lsblk"), "");  // not executable
  fs::permissions(dir.Path("a/lsblk"), fs::perms::owner_read);
  fs::create_directory(dir.Path("b/lsblk"));
  WriteFile(dir.Path("c/lsblk"), "");
  fs::permissions(dir.Path("c/lsblk"), fs::perms::owner_all);
  std::string const path = dir.Path("none") + ":" + dir.Path("a") + ":" + dir.Path("b");
  EXPECT_EQ(TextOf(CheckProgram("lsblk", path + ":" + dir.Path("c"), "util-linux")), "works: " + dir.Path("c/lsblk"));
  EXPECT_EQ(TextOf(CheckProgram("lsblk", path, "util-linux")),
            "lsblk is in no directory of PATH -> install the package util-linux");
  EXPECT_EQ(TextOf(CheckProgram("lsblk", "", "util-linux")),
            "lsblk is in no directory of PATH -> install the package util-linux");
}

TEST(ChecksTest, ALogDirectoryCanBeWrittenOrCreated) {
  TTempDir const dir;
  EXPECT_EQ(TextOf(CheckLogDirectory(dir.Path() + "/")), "works: " + dir.Path() + "/ can be written");
  EXPECT_EQ(TextOf(CheckLogDirectory(dir.Path("a/b/"))), "works: " + dir.Path("a/b/") + " can be created");
  WriteFile(dir.Path("file"), "");
  EXPECT_EQ(TextOf(CheckLogDirectory(dir.Path("file") + "/")),
            dir.Path("file") + " is not a directory -> remove or rename " + dir.Path("file"));
  EXPECT_EQ(TextOf(CheckLogDirectory(dir.Path("file/b/"))),
            dir.Path("file") + " is not a directory -> remove or rename " + dir.Path("file"));
}

TEST(ChecksTest, ADebugLogContainsPasswords) {
  std::string const fails =
      "debug entries are logged: the log contains the passwords of controllers' sessions -> set the threshold to status "
      "(TLogger::SetLogThreshold)";
  TPlugIn const quiet{"Quiet", "/p/libQuiet.nsp.so", 1, "", {}};
  TPlugIn verbose{"Verbose", "/p/libVerbose.nsp.so", 1, "", {}};
  verbose.fLogsDebug = true;
  EXPECT_EQ(TextOf(CheckLogThreshold(ILogger::kLogStatus, {quiet})), "works: debug entries are dropped");
  for (auto const severity : {ILogger::kLogDebug, ILogger::kLogVerbose})
    EXPECT_EQ(TextOf(CheckLogThreshold(severity, {quiet})), fails);
  EXPECT_EQ(TextOf(CheckLogThreshold(ILogger::kLogStatus, {quiet, verbose})), fails + " in /p/libVerbose.nsp.so");
}

TEST(ChecksTest, EachPlugInHasACheck) {
  TPlugIn good{"Good", "/p/libGood.nsp.so", 1, "", {{"Good", nullptr, 1, ""}}};
  TPlugIn bad{"Bad", "/p/libBad.nsp.so", 1, "no such symbol", {}};
  bad.fStage = "open";
  TPlugIn const empty{"Empty", "/p/libEmpty.nsp.so", 1, "", {}};
  std::vector<TCheck> const checks = CheckPlugIns({good, bad, empty}, "/p");
  ASSERT_EQ(checks.size(), 3u);
  EXPECT_EQ(checks[0].fName, "plug-in Good");
  EXPECT_EQ(TextOf(checks[0]), "works: /p/libGood.nsp.so");
  EXPECT_EQ(checks[1].fName, "plug-in Bad");
  EXPECT_EQ(TextOf(checks[1]), "Bad: no such symbol (open, libBad.nsp.so) -> mend /p/libBad.nsp.so, or remove it");
  EXPECT_EQ(TextOf(checks[2]), "it registers no provider -> mend /p/libEmpty.nsp.so, or remove it");

  std::vector<TCheck> const none = CheckPlugIns({}, "/p");
  ASSERT_EQ(none.size(), 1u);
  EXPECT_EQ(TextOf(none[0]), "there is no plug-in in /p -> install the package zep-provider-host, or copy plug-ins there");
}

TEST(ChecksTest, TheRemedyForAFileThatIsPassedOverIsThatOfTheRule) {
  TPlugIn plugIn{"Gone", "/p/libGone.nsp.so", 0, "why", {}};
  std::map<EPlugInRule, std::string> const remedies = {
      {EPlugInRule::kMissing, "correct the path after --plugin, or remove the broken link"},
      {EPlugInRule::kKind, "replace /p/libGone.nsp.so with a regular file, or remove it"},
      {EPlugInRule::kPermission, "let this user read /p/libGone.nsp.so"},
      {EPlugInRule::kWritable, "let only root write /p/libGone.nsp.so and the directories above it, or pass --allow-writable"},
      {EPlugInRule::kReplaced, "name one plug-in of a name with --plugin"},
      {EPlugInRule::kName, "rename /p/libGone.nsp.so to lib<NAME>.nsp.so, or remove it"}};
  for (auto const& [rule, remedy] : remedies) {
    plugIn.fRule = rule;
    EXPECT_EQ(CheckPlugIns({plugIn}, "/p").front().fRemedy, remedy);
  }
}

TEST(ChecksTest, TheStatusIsCompleteOnlyWhenEverythingWorks) {
  TCheck const works{"a", true, "", ""}, fails{"b", false, "", "r"};
  EXPECT_EQ(StatusOf(std::vector<TCheck>{works, works}), kExitComplete);
  EXPECT_EQ(StatusOf(std::vector<TCheck>{works, fails}), kExitPartial);
}

}  // namespace
}  // namespace NQRVZEP20::zep
