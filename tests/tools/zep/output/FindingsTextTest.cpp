// SPDX-License-Identifier: Apache-2.0

// The findings of zep report, run as users run it, on recorded machines.

#include "tests/Machines.h"
#include "tests/SmbiosTables.h"
#include "tests/tools/zep/Zep.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

namespace NQRVZEP20::zep {
namespace {

using testing::AllOf;
using testing::ElementsAre;
using testing::HasSubstr;
using testing::IsEmpty;
using testing::Not;

class FindingsTextTest : public testing::Test {
protected:
  static void SetUpTestSuite() {
    fInstalled = new TInstallation;
    for (char const* library : {"libStorage.nsp.so", "libNetwork.nsp.so", "libDevices.nsp.so", "libSensors.nsp.so"})
      fInstalled->Add(library, std::string(TEST_LIB_DIR "/") + library);
  }
  static void TearDownTestSuite() {
    delete fInstalled;
    Machines().clear();
  }

  TRun Report(std::string const& machine, std::vector<std::string> arguments = {}) const {
    auto const recorded = Machines().try_emplace(machine, machine).first;
    arguments.insert(arguments.begin(), "report");
    return fInstalled->Run({arguments, {{"ZEP_ROOT", recorded->second.Root()}}, false, false, false, "", -1, fDir.Path()});
  }

  // The problems of the document, as "severity rule".
  static std::vector<std::string> ProblemsOf(nlohmann::json const& document) {
    std::vector<std::string> problems;
    for (nlohmann::json const& problem : document["findings"]["problems"])
      problems.push_back(problem["severity"].get<std::string>() + " " + problem["rule"].get<std::string>());
    return problems;
  }

  // The recorded machines in use, by name; each is unpacked once.
  static std::map<std::string, TRecordedMachine>& Machines() {
    static std::map<std::string, TRecordedMachine> machines;
    return machines;
  }

  static TInstallation* fInstalled;
  TTempDir const fDir;  // the working directory, which may have settings
};

TInstallation* FindingsTextTest::fInstalled = nullptr;

TEST_F(FindingsTextTest, TheFaultsOfADegradedMachineAreFound) {
  nlohmann::json const document = JsonOf(Report("degraded", {"--json"}));
  EXPECT_THAT(ProblemsOf(document),
              ElementsAre("critical array-degraded", "error file-system-full", "error bond-member", "warning failed-units"));
  nlohmann::json const& array = document["findings"]["problems"][0];
  EXPECT_EQ(array["reason"], "the RAID array md0 is degraded: 1 of 2 members is missing");
  EXPECT_EQ(array["remedy"], "Replace the failed disk and add the new one (mdadm --add).");
  EXPECT_THAT(array["instance"].get<std::string>(), AllOf(HasSubstr("ZEP_RaidArray"), HasSubstr("DeviceID=\"md0\"")));
  EXPECT_EQ(document["findings"]["worst"], "critical");
}

TEST_F(FindingsTextTest, AHealthyMachineHasNone) {
  nlohmann::json const document = JsonOf(Report("server", {"--json"}));
  EXPECT_THAT(ProblemsOf(document), IsEmpty());
  EXPECT_TRUE(document["findings"]["worst"].is_null());
  std::map<std::string, int> examined;
  for (nlohmann::json const& rule : document["findings"]["rules"]) examined[rule["id"]] = rule["examined"];
  for (char const* rule : {"disk-lost", "array-degraded", "file-system-full", "port-errors", "pci-link"})
    EXPECT_GT(examined[rule], 0) << rule << " has judged nothing";
}

TEST_F(FindingsTextTest, TablesOfVirtualFirmwareGiveNone) {
  for (std::string const& table : kRealTables) {
    TTempDir const root;
    fs::create_directories(root.Path("sys/firmware/dmi"));
    fs::copy(TestDataPath("smbios/" + table), root.Path("sys/firmware/dmi/tables"));
    nlohmann::json const document = JsonOf(fInstalled->Run({{"report", "--json"}, {{"ZEP_ROOT", root.Path()}}}));
    EXPECT_THAT(ProblemsOf(document), IsEmpty()) << table;
    EXPECT_FALSE(document["instances"].empty()) << table;
  }
}

TEST_F(FindingsTextTest, AProcessKilledForLackOfMemoryIsFound) {
  TTempDir const root;
  fs::create_directories(root.Path("dev"));
  fs::create_directories(root.Path("proc"));
  fs::copy(TestDataPath("kmsg/memory-and-disk"), root.Path("dev/kmsg"));
  WriteFile(root.Path("proc/uptime"), "7230.00 1.0\n");
  nlohmann::json const document = JsonOf(fInstalled->Run({{"report", "--json"}, {{"ZEP_ROOT", root.Path()}}}));
  EXPECT_THAT(ProblemsOf(document),
              ElementsAre("error out-of-memory", "error disk-errors", "error disk-errors", "warning out-of-memory"));
  nlohmann::json const& killed = document["findings"]["problems"][0];
  EXPECT_EQ(killed["reason"], "the kernel killed the process tail because no memory was left, 2 hours ago");
  EXPECT_EQ(killed["source"], "/dev/kmsg");
}

TEST_F(FindingsTextTest, AMachineCheckAndADamagedFileSystemAreFound) {
  TTempDir const root;
  fs::create_directories(root.Path("dev"));
  fs::create_directories(root.Path("proc"));
  fs::copy(TestDataPath("kmsg/machine-check-and-file-system"), root.Path("dev/kmsg"));
  WriteFile(root.Path("proc/uptime"), "7230.00 1.0\n");
  nlohmann::json const document = JsonOf(fInstalled->Run({{"report", "--json"}, {{"ZEP_ROOT", root.Path()}}}));
  EXPECT_THAT(ProblemsOf(document),
              AllOf(testing::Contains(HasSubstr("hardware-errors")), testing::Contains(HasSubstr("disk-errors"))));
}

TEST_F(FindingsTextTest, BondsWithOneMemberAreFound) {
  nlohmann::json const document = JsonOf(Report("network", {"--json"}));
  EXPECT_THAT(ProblemsOf(document), ElementsAre("warning bond-member", "warning bond-member"));
  EXPECT_EQ(document["findings"]["problems"][0]["reason"], "the bond lacp-a has only one member");
}

TEST_F(FindingsTextTest, EveryRuleHasAnAnswerAndEveryUnansweredOneAReason) {
  nlohmann::json const findings = JsonOf(Report("server", {"--json"}))["findings"];
  EXPECT_GE(findings["rules"].size(), 29u);
  for (nlohmann::json const& rule : findings["rules"]) {
    EXPECT_THAT(rule["question"].get<std::string>(), testing::EndsWith("?"));
    if (rule["outcome"] == "not-asked") {
      EXPECT_FALSE(rule["notExamined"].empty()) << rule;
    }
    for (nlohmann::json const& element : rule["notExamined"]) EXPECT_FALSE(element["reason"].get<std::string>().empty()) << rule;
  }
  EXPECT_EQ(findings["thresholds"]["finding-file-system-free-percent"], 10);
}

TEST_F(FindingsTextTest, AProblemThatAPlugInReportsIsFoundAndGone) {
  TTempDir const batteries;
  fs::create_directory(batteries.Path("BAT0"));
  TEnvironmentGuard const directory("EXAMPLE_BATTERIES", batteries.Path().c_str());
  auto const problemsAt = [&](char const* charge) {
    WriteFile(batteries.Path("BAT0/capacity"), charge);
    TRun const run = Report("server", {"--json", "--fail-on", "warning", "--plugin", BATTERIES_PLUGIN});
    auto const problems = JsonOf(run)["findings"]["problems"];
    EXPECT_EQ(run.fStatus == 3, !problems.empty());
    return problems;
  };
  auto const problems = problemsAt("19\n");
  ASSERT_EQ(problems.size(), 1U);
  EXPECT_EQ(problems[0]["rule"], "battery-charge");
  EXPECT_EQ(problems[0]["severity"], "warning");
  EXPECT_EQ(problems[0]["reason"], "the battery BAT0 has only 19 % left");
  EXPECT_EQ(problems[0]["remedy"], "Connect the machine to its power supply, and check that the battery charges.");
  EXPECT_EQ(problems[0]["instance"], "X_Battery.Name=\"BAT0\"");
  EXPECT_EQ(problems[0]["source"], "sysfs");
  EXPECT_THAT(problemsAt("20\n"), IsEmpty());
}

TEST_F(FindingsTextTest, RulesWithNothingToExamineAndWithoutASourceAreCountedApart) {
  TTempDir const root;  // a machine that has nothing
  nlohmann::json const findings = JsonOf(fInstalled->Run({{"report", "--json"}, {{"ZEP_ROOT", root.Path()}}}))["findings"];
  std::map<std::string, int> counted;
  for (nlohmann::json const& rule : findings["rules"]) {
    bool const isIdle = rule["outcome"] == "fine" && rule["examined"] == 0;
    ++counted[rule["outcome"] == "not-asked" ? "notAsked" : isIdle ? "nothingToExamine" : "asked"];
  }
  for (char const* name : {"asked", "nothingToExamine", "notAsked"}) EXPECT_EQ(findings["counts"][name], counted[name]) << name;
  std::vector<std::string> withoutSource;
  for (nlohmann::json const& rule : findings["rules"])
    for (std::string const each : {"sensor-threshold", "fan-stopped", "power-supply-lost", "memory-errors", "pci-errors",
                                   "pci-link", "processor-weakness"})
      if (rule["id"] == each && rule["outcome"] == "not-asked") withoutSource.push_back(each);
  EXPECT_EQ(withoutSource.size(), 7u);

  std::string const text = fInstalled->Run({{"report"}, {{"ZEP_ROOT", root.Path()}}}).fOutput;
  EXPECT_THAT(text, HasSubstr(std::to_string(counted["nothingToExamine"]) + " had nothing to"));
}

TEST_F(FindingsTextTest, TheTextBeginsWithTheProblemsAndTheirRemedies) {
  std::string const text = Report("degraded").fOutput;
  EXPECT_THAT(text, HasSubstr("\n\nFindings: 1 critical, 2 errors, 1 warning ("));
  EXPECT_THAT(text, HasSubstr("\ncritical     the RAID array md0 is degraded: 1 of 2 members is missing.\n"
                              "             Replace the failed disk and add the new one (mdadm --add).\n"
                              "error        the file system on /data is full.\n"
                              "             Delete what is not needed, or enlarge the file system.\n"
                              "error        the bond bond0 lacks its member eth0, which is switched off.\n"));
  EXPECT_LT(text.find("Findings:"), text.find("Identity"));
  EXPECT_THAT(Report("server").fOutput, HasSubstr("\nFindings: nothing wrong ("));
}

TEST_F(FindingsTextTest, TheSectionListsEveryRule) {
  std::string const text = Report("degraded", {"--section", "findings"}).fOutput;
  EXPECT_THAT(text, AllOf(HasSubstr("\ndisk-failing "), HasSubstr("\nfailed-units "), Not(HasSubstr("Identity"))));
}

TEST_F(FindingsTextTest, FailOnGivesStatus3ForThatSeverityOrAWorseOne) {
  EXPECT_NE(Report("degraded").fStatus, 3);
  EXPECT_EQ(Report("degraded", {"--fail-on", "error"}).fStatus, 3);
  EXPECT_EQ(Report("degraded", {"--fail-on", "critical"}).fStatus, 3);
  EXPECT_NE(Report("server", {"--fail-on", "information"}).fStatus, 3);
  TRun const run = Report("degraded", {"--fail-on", "warning", "--json"});
  nlohmann::json const document = JsonOf(run);
  EXPECT_EQ(run.fStatus, 3);
  EXPECT_EQ(document["exitStatus"], 3);
  EXPECT_EQ(document["reason"], "1 critical, 2 errors, 1 warning");
}

TEST_F(FindingsTextTest, AnUnknownSeverityIsWrongUsage) {
  TRun const run = Report("server", {"--fail-on", "dreadful"});
  EXPECT_EQ(run.fStatus, 64);
  EXPECT_THAT(run.fErrors, HasSubstr("--fail-on takes information, warning, error or critical"));
}

TEST_F(FindingsTextTest, SettingsChangeThresholdsAndAreNamed) {
  WriteFile(fDir.Path("zep.cfg"), "finding-clock-grace-minutes=1\n");
  EXPECT_THAT(Report("server").fOutput, HasSubstr("thresholds   set in zep.cfg: finding-clock-grace-minutes=1\n"));
  WriteFile(fDir.Path("zep.cfg"), "finding-clock-grace-minutes=soon\n");
  TRun const run = Report("server");
  EXPECT_EQ(run.fStatus, 64);
  EXPECT_THAT(run.fErrors, HasSubstr("setting finding-clock-grace-minutes: \"soon\" is not a whole number from 0 to 1000000"));
}

TEST_F(FindingsTextTest, ASampleIsJudgedOnlyByItsOwnInstances) {
  nlohmann::json const document = JsonOf(fInstalled->Run({{"report", "--sample", "--json"}}));
  EXPECT_THAT(ProblemsOf(document), IsEmpty());
  for (nlohmann::json const& rule : document["findings"]["rules"])
    if (rule["id"] == "clock-synchronized") {
      EXPECT_EQ(rule["notExamined"][0]["reason"], "the sample does not describe them");
    }
}

}  // namespace
}  // namespace NQRVZEP20::zep
