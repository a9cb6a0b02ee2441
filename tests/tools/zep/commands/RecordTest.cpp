// SPDX-License-Identifier: Apache-2.0

// zep record and zep report --replay. tests/system/machines compares the reports.

#include "tests/tools/zep/TFileLimit.h"
#include "tests/tools/zep/Timing.h"
#include "tests/tools/zep/Zep.h"

#include <gmock/gmock.h>

namespace NQRVZEP20::zep {
namespace {

using testing::HasSubstr;
using testing::IsEmpty;
using testing::StartsWith;

class RecordTest : public testing::Test {
protected:
  TRun Run(std::vector<std::string> const& arguments, std::map<std::string, std::string> environment = {}) {
    environment["TMPDIR"] = fTemporary.Path();
    TCall call = {arguments, environment};
    call.fDirectory = fZep.Path("");
    return fZep.Run(call);
  }

  std::size_t TemporaryFiles() const {
    return static_cast<std::size_t>(std::distance(fs::directory_iterator(fTemporary.Path()), fs::directory_iterator()));
  }

  TInstallation fZep;
  TTempDir fTemporary;
};

TEST_F(RecordTest, ARecordingIsForItsOwnerAndReadableWithTar) {
  TRun const run = Run({"record", "here.rec"});
  EXPECT_EQ(run.fStatus, 0) << run.fErrors;
  EXPECT_THAT(run.fOutput, StartsWith("The recording here.rec has "));
  EXPECT_THAT(run.fOutput, HasSubstr("passwords in them included"));
  EXPECT_EQ(fs::status(fZep.Path("here.rec")).permissions(), fs::perms::owner_read | fs::perms::owner_write);
  std::string const list = "tar --zstd -tf '" + fZep.Path("here.rec") + "' root/proc/meminfo > '" + fZep.Path("list") + "' 2>&1";
  EXPECT_EQ(std::system(list.c_str()), 0);
  EXPECT_EQ(ReadFile(fZep.Path("list")), "root/proc/meminfo\n");  // and no warning
  EXPECT_EQ(TemporaryFiles(), 0u);
}

TEST_F(RecordTest, ARefusedRecordingIsNamedAndNothingOfItRemains) {
  WriteFile(fZep.Path("bad.rec"), "hello");
  TRun const run = Run({"report", "--replay", "bad.rec"});
  EXPECT_EQ(run.fStatus, 66);
  EXPECT_THAT(run.fErrors, StartsWith("zep: bad.rec is refused: it is cut, damaged or not a zstd-compressed tar archive"));
  EXPECT_THAT(run.fOutput, IsEmpty());
  EXPECT_EQ(Run({"report", "--replay", "none.rec"}).fErrors, "zep: none.rec cannot be read: it is not a file\n");
  EXPECT_EQ(TemporaryFiles(), 0u);
}

TEST_F(RecordTest, AFullTemporaryDirectoryIsNamedWithTheRemedy) {
  ASSERT_EQ(Run({"record", "here.rec"}).fStatus, 0);
  TFileLimit const limit(700);
  TRun const run = Run({"report", "--replay", "here.rec"});
  EXPECT_EQ(run.fStatus, 73);
  EXPECT_THAT(run.fErrors, StartsWith("zep: here.rec cannot be unpacked into the temporary directory " + fTemporary.Path()));
  EXPECT_THAT(run.fErrors, HasSubstr("File too large; free space in it, or name another directory in TMPDIR\n"));
  EXPECT_EQ(TemporaryFiles(), 0u);
}

TEST_F(RecordTest, ARecordingIsOfOneMachine) {
  TRun const run = Run({"record", "here.rec"}, {{"ZEP_SMBIOS_TABLE", SamplePath()}, {"ZEP_HOST_NAME", "other-host"}});
  EXPECT_EQ(run.fStatus, 0) << run.fErrors;
  EXPECT_THAT(Run({"report", "--replay", "here.rec"}).fOutput, testing::Not(HasSubstr("other-host")));
}

// Root replays what a user recorded, and is refused what the user was refused.
TEST_F(RecordTest, ARecordingByAUserGivesTheReportOfThatUser) {
  NEEDS(::geteuid() == 0, "root, to become another user");
  TTempDir const machine;
  std::string const tables = machine.Path("sys/firmware/dmi/tables");
  fs::create_directories(tables);
  fs::copy(SamplePath(), tables + "/DMI");
  fs::permissions(tables + "/DMI", fs::perms::owner_read);
  for (std::string const& directory : {machine.Path(), fTemporary.Path()}) fs::permissions(directory, fs::perms::all);

  std::string const recording = fTemporary.Path("user.rec");
  auto const runAsNobody = [&](std::vector<std::string> const& arguments) {
    return fZep.Run({arguments, {{"ZEP_ROOT", machine.Path()}, {"ZEP_SCSI_DEVICES", ""}, {"TMPDIR", fTemporary.Path()}}, true});
  };
  ASSERT_EQ(runAsNobody({"record", recording}).fStatus, 0);
  std::string const report = WithoutTiming(runAsNobody({"report", "--json"}).fOutput);
  EXPECT_THAT(report, HasSubstr("only root can read the SMBIOS tables"));
  EXPECT_EQ(WithoutTiming(Run({"report", "--json", "--replay", recording}).fOutput), report);
}

// The thresholds and paths of the machine that replays do not matter.
TEST_F(RecordTest, AReplayUsesTheThresholdsAndPathsOfTheRecordedMachine) {
  WriteFile(fZep.Path("zep.cfg"), "finding-file-system-free-percent=42\n");
  EXPECT_EQ(Run({"record", "here.rec"}).fStatus, 0);
  WriteFile(fZep.Path("zep.cfg"), "finding-file-system-free-percent=7\n");
  TInstallation const other;
  TCall call{{"report", "--json", "--replay", fZep.Path("here.rec")}, {}};
  call.fDirectory = fZep.Path("");
  auto const document = nlohmann::json::parse(other.Run(call).fOutput);
  EXPECT_EQ(document["findings"]["thresholds"]["finding-file-system-free-percent"], 42);
  EXPECT_EQ(document["plugInDirectory"], nlohmann::json::parse(Run({"report", "--json"}).fOutput)["plugInDirectory"]);
  EXPECT_THAT(document["plugIns"][0]["file"].get<std::string>(),
              StartsWith(document["plugInDirectory"].get<std::string>() + "/"));
}

TEST_F(RecordTest, APlugInThatCannotBeRecordedIsNamedAndNotReplayed) {
  fZep.Add("libClock.nsp.so", CLOCK_PLUGIN);
  TRun const run = Run({"record", "here.rec"});
  EXPECT_EQ(run.fStatus, 2);
  EXPECT_THAT(run.fOutput, HasSubstr("Not recorded: libClock.nsp.so: it does not read through TMachineFiles of zepcore"));
  EXPECT_EQ(JsonOf(Run({"record", "again.rec", "--json"}))["notRecorded"][0]["file"], "libClock.nsp.so");
  TRun const replay = Run({"report", "--replay", "here.rec"});
  EXPECT_EQ(replay.fErrors, "zep: here.rec has nothing of libClock.nsp.so, which is therefore not loaded\n");
}

}  // namespace
}  // namespace NQRVZEP20::zep
