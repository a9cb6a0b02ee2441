// SPDX-License-Identifier: Apache-2.0

// zep record and zep report --replay with all providers of this project, on a recorded machine and on this one.

#include "tests/Machines.h"
#include "tests/tools/zep/Timing.h"
#include "tests/tools/zep/Zep.h"

#include <gmock/gmock.h>

#include <sched.h>
#include <sys/mount.h>

namespace NQRVZEP20::zep {
namespace {

class RecordTest : public testing::Test {
protected:
  RecordTest() {
    for (char const* library : {"libDevices.nsp.so", "libNetwork.nsp.so", "libStorage.nsp.so", "libSensors.nsp.so"})
      fInstalled.Add(library, std::string(TEST_LIB_DIR "/") + library);
    fRecording = fInstalled.Path("machine.rec");
  }

  std::string Report(std::vector<std::string> const& options, std::map<std::string, std::string> const& environment = {}) {
    TCall call{{"report", "--json"}, environment};
    call.fArguments.insert(call.fArguments.end(), options.begin(), options.end());
    TRun const run = fInstalled.Run(call);
    EXPECT_THAT(run.fStatus, testing::AnyOf(0, 2)) << run.fErrors;
    return WithoutTiming(run.fOutput);
  }

  TInstallation fInstalled;
  std::string fRecording;
};

TEST_F(RecordTest, ARecordingOfAServerGivesItsReport) {
  TRecordedMachine const server("server");
  std::map<std::string, std::string> const there = {{"ZEP_ROOT", server.Root()}, {"ZEP_SCSI_DEVICES", ""}};
  TRun const run = fInstalled.Run({{"record", fRecording}, there});
  ASSERT_EQ(run.fStatus, 0) << run.fErrors;
  std::string const report = Report({}, there);
  EXPECT_GT(report.size(), 1000000u);
  EXPECT_EQ(Report({"--replay", fRecording}), report);
}

// Makes another machine of this process: without sysfs and the records of udev, and with no network and another name.
bool BecomeAnotherMachine() {
  if (::unshare(CLONE_NEWNS | CLONE_NEWNET | CLONE_NEWUTS) != 0) return false;
  if (::mount("none", "/", nullptr, MS_REC | MS_PRIVATE, nullptr) != 0) return false;
  for (char const* directory : {"/sys", "/run", "/etc"})
    if (::mount("none", directory, "tmpfs", 0, nullptr) != 0) return false;
  return ::sethostname("elsewhere", 9) == 0;
}

// The report and the recording are made by one run, because this machine does not stand still.
TEST_F(RecordTest, ThisMachineIsReportedElsewhereAsHere) {
  if (::geteuid() != 0) GTEST_SKIP() << "only root can make namespaces";
  TTempDir const copy;
  std::string const here = Report({}, {{"ZEP_ROOT", copy.Path()}, {"ZEP_RECORD_FROM", "/"}, {"ZEP_SCSI_DEVICES", ""}});
  ASSERT_EQ(fInstalled.Run({{"record", fRecording}, {{"ZEP_ROOT", copy.Path()}}}).fStatus, 0);
  pid_t const child = ::fork();
  if (child == 0) {
    bool const isElsewhere = BecomeAnotherMachine();
    WriteFile(fInstalled.Path("elsewhere.json"), isElsewhere ? Report({"--replay", fRecording}) : "");
    ::_exit(0);
  }
  int status = 0;
  ASSERT_EQ(::waitpid(child, &status, 0), child);
  EXPECT_EQ(ReadFile(fInstalled.Path("elsewhere.json")), here);
}

}  // namespace
}  // namespace NQRVZEP20::zep
