// SPDX-License-Identifier: Apache-2.0

// zep doctor, in surroundings that the tests make. ChecksTest has every state of every check.

#include "tests/tools/zep/Envelope.h"
#include "tests/tools/zep/Zep.h"

#include <gmock/gmock.h>

namespace NQRVZEP20::zep {
namespace {

using testing::HasSubstr;

class DoctorTest : public testing::Test {
protected:
  DoctorTest() {
    fs::create_directory(fZep.Path("programs"));
    AddProgram("lsblk");
    AddProgram("hwinfo");
    fCall.fEnvironment = {{"PATH", fZep.Path("programs")}, {"ZEP_SMBIOS_TABLE", fZep.Path("share/zepcore/sample/smbios.bin")}};
  }

  void AddProgram(std::string const& name) {
    WriteFile(fZep.Path("programs/" + name), "");
    fs::permissions(fZep.Path("programs/" + name), fs::perms::owner_all | fs::perms::others_exec);
  }

  // The check of that name in the document of zep doctor --json.
  nlohmann::json Check(std::string const& name, std::vector<std::string> const& options = {}) {
    fCall.fArguments = {"doctor", "--json"};
    fCall.fArguments.insert(fCall.fArguments.end(), options.begin(), options.end());
    TRun const run = fZep.Run(fCall);
    ExpectEnvelope(run.fOutput, run.fStatus, "zep doctor");
    nlohmann::json const checks = JsonOf(run)["checks"];
    EXPECT_GT(checks.size(), 8u);
    nlohmann::json found;
    bool doAllWork = true;
    for (auto const& check : checks) {
      doAllWork = doAllWork && check["works"];
      EXPECT_EQ(check["works"], check["remedy"].is_null()) << check;
      if (check["name"] == name) found = check;
    }
    EXPECT_EQ(run.fStatus, doAllWork ? 0 : 2);
    return found;
  }

  TInstallation fZep;
  TCall fCall;
};

TEST_F(DoctorTest, ProgramsAreSearchedOnPath) {
  EXPECT_EQ(Check("lsblk")["finding"], fZep.Path("programs/lsblk"));
  EXPECT_EQ(Check("hwinfo")["works"], true);
  fs::remove(fZep.Path("programs/hwinfo"));
  EXPECT_EQ(Check("hwinfo")["remedy"], "install the package hwinfo");
  EXPECT_EQ(Check("lsblk")["works"], true);
}

TEST_F(DoctorTest, TheSmbiosTableIsOpened) {
  EXPECT_EQ(Check("SMBIOS")["works"], true);
  fCall.fEnvironment["ZEP_SMBIOS_TABLE"] = "/nowhere";
  EXPECT_EQ(Check("SMBIOS")["finding"], "/nowhere, which ZEP_SMBIOS_TABLE names, does not exist");
  fZep.Remove("libsmbios.so");
  EXPECT_THAT(Check("SMBIOS")["finding"], HasSubstr("libsmbios.so cannot be loaded"));
}

TEST_F(DoctorTest, WithoutPrivilegesRootIsTheRemedy) {
  fCall.fAsNobody = true;
  EXPECT_EQ(Check("root")["remedy"], "run zep as root");
}

TEST_F(DoctorTest, EveryPlugInIsLoadedApart) {
  WriteFile(fZep.Path("lib/libBroken.nsp.so"), "not a library");
  fZep.Add("libTest.nsp.so", TEST_PROVIDER);
  EXPECT_EQ(Check("plug-in Host")["works"], true);
  EXPECT_EQ(Check("plug-in Test")["works"], true);
  EXPECT_THAT(Check("plug-in Broken")["finding"], HasSubstr("libBroken.nsp.so"));
  fCall.fEnvironment["ZEP_TEST_PROVIDER"] = "is-refused";
  EXPECT_THAT(Check("plug-in Test")["finding"], HasSubstr("X_Refused.Kind refused"));
  EXPECT_EQ(Check("plug-in Host")["works"], true);
}

TEST_F(DoctorTest, APlugInThatRegistersNothingDoesNotWork) {
  fZep.Add("libRegistersNothing.nsp.so", FAULTY);
  EXPECT_EQ(Check("plug-in RegistersNothing")["works"], false);
  EXPECT_EQ(Check("plug-in RegistersNothing")["finding"], "it registers no provider");
}

TEST_F(DoctorTest, ATriedPlugInThatIsMissingHasItsRemedy) {
  nlohmann::json const check = Check("plug-in Gone", {"--plugin", "/nowhere/libGone.nsp.so"});
  EXPECT_THAT(check["finding"], HasSubstr("No such file or directory"));
  EXPECT_EQ(check["remedy"], "correct the path after --plugin, or remove the broken link");
}

TEST_F(DoctorTest, APlugInThatTurnsTheDebugLogOnIsNoticed) {
  fZep.Add("libTest.nsp.so", TEST_PROVIDER);
  EXPECT_EQ(Check("log threshold")["works"], true);
  fCall.fEnvironment["ZEP_TEST_PROVIDER"] = "logs-debug";
  fCall.fEnvironment["ASAN_OPTIONS"] = "detect_leaks=0";  // clang 14's search for leaks crashes here itself (LSan tracer)
  for (std::vector<std::string> const& options : {std::vector<std::string>{}, {"--in-process"}}) {
    EXPECT_EQ(Check("log threshold", options)["works"], false);
    EXPECT_EQ(Check("log threshold", options)["remedy"],
              "set the threshold to status (TLogger::SetLogThreshold) in " + fZep.Path("lib/libTest.nsp.so"));
  }
}

TEST_F(DoctorTest, TheTextHasARowForEachCheckWithItsRemedy) {
  fs::remove(fZep.Path("programs/hwinfo"));
  fCall.fArguments = {"doctor"};
  TRun const run = fZep.Run(fCall);
  EXPECT_EQ(run.fStatus, 2);
  EXPECT_THAT(run.fOutput, testing::ContainsRegex("^Check +Works +Finding\n"));
  EXPECT_THAT(run.fOutput, testing::ContainsRegex("\nhwinfo +no +hwinfo is in no directory of PATH\\. Remedy: install"));
  for (char const* check : {"root ", "SMBIOS ", "controller ", "libcurl ", "lsblk ", "log ", "plug-in "})
    EXPECT_THAT(run.fOutput, HasSubstr("\n" + std::string(check)));
}

}  // namespace
}  // namespace NQRVZEP20::zep
