// SPDX-License-Identifier: Apache-2.0

// zep show, run as users run it.

#include "tests/tools/zep/Zep.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <algorithm>
#include <set>

namespace NQRVZEP20::zep {
namespace {

using testing::ElementsAre;
using testing::HasSubstr;

class ShowTest : public testing::Test {
protected:
  ShowTest() { fZep.Add("libTest.nsp.so", TEST_PROVIDER); }

  TRun Run(std::vector<std::string> const& arguments, std::string const& behaviour = "odd") {
    TCall call;
    call.fArguments = arguments;
    call.fEnvironment = {{"ZEP_SMBIOS_TABLE", SamplePath()}, {"ZEP_HOST_NAME", "db1"}, {"ZEP_TEST_PROVIDER", behaviour}};
    return fZep.Run(call);
  }

  TInstallation fZep;
};

TEST_F(ShowTest, EveryPathInAReportIsShown) {
  TTempDir const nothing;  // instead of this machine, whose load changes
  TEnvironmentGuard const root("ZEP_ROOT", nothing.Path().c_str());
  auto const instances = JsonOf(Run({"report", "--json"}))["instances"];
  EXPECT_GT(instances.size(), 100u);
  for (auto const& instance : instances) {
    TRun const run = Run({"show", instance["path"], "--json"});
    EXPECT_EQ(run.fStatus, 0) << instance["path"] << run.fErrors;
    if (run.fStatus != 0) continue;
    EXPECT_EQ(JsonOf(run)["object"], instance);
  }
}

TEST_F(ShowTest, EveryPathNamesOneObject) {
  TTempDir const nothing;
  TEnvironmentGuard const root("ZEP_ROOT", nothing.Path().c_str());
  auto const instances = JsonOf(Run({"report", "--json"}, "hard-to-name"))["instances"];
  std::set<std::string> paths;
  for (auto const& instance : instances) {
    paths.insert(instance["path"]);
    TRun const run = Run({"show", instance["path"], "--json"}, "hard-to-name");
    EXPECT_EQ(run.fStatus, 0) << instance["path"] << run.fErrors;
    if (run.fStatus != 0) continue;
    EXPECT_EQ(JsonOf(run)["object"], instance);
  }
  EXPECT_EQ(paths.size(), instances.size());
  for (char const* path : {"root/test:X_Note#1", "root/test:X_Note#2", "root/test:X_LateNote#1", "root/test:X_Plain#1",
                           "root/test:X_Bytes.Id=\"\\xff\"", "root/test:X_Bytes.Id=\"\\xfe\"", "root/test:X_Bytes.Id=\"\\\\xff\"",
                           "root/test:X_Bytes.Id=\"\xef\xbf\xbd\""})
    EXPECT_THAT(paths, testing::Contains(path));
}

TEST_F(ShowTest, EveryPathInAListOfInstancesIsShown) {
  for (std::string const name : {"X_Note", "X_LateNote", "X_Plain", "X_Bytes", "X_ToBytes"}) {
    std::string const text = Run({"show", name}, "hard-to-name").fOutput;
    auto const lines = LinesOf(text.substr(text.find("\nInstances\n") + 11));
    auto const listed = JsonOf(Run({"show", name, "--json"}, "hard-to-name"))["object"]["instances"];
    ASSERT_EQ(lines.size(), listed.size());
    for (std::size_t at = 0; at < lines.size(); ++at)
      EXPECT_EQ(JsonOf(Run({"show", lines[at], "--json"}, "hard-to-name"))["object"]["path"], listed[at]) << lines[at];
  }
}

TEST_F(ShowTest, AnInstanceWithoutKeysHasANumber) {
  EXPECT_THAT(Run({"show", "X_Note#2"}, "hard-to-name").fOutput,
              testing::AllOf(testing::StartsWith("root/test:X_Note#2\n\n"), HasSubstr("second\n")));
  EXPECT_THAT(Run({"show", "X_Note"}, "hard-to-name").fOutput,
              testing::EndsWith("\nInstances\nroot/test:X_Note#1\nroot/test:X_Note.Id=\"1\"\nroot/test:X_Note#2\n"
                                "root/test:X_LateNote#1\n"));
  for (std::string const path : {"X_Note#3", "X_Note#0", "X_Note#", "X_Note#x", "X_LateNote#2", "X_None#1", "#1"})
    EXPECT_EQ(Run({"show", path}, "hard-to-name").fStatus, 1) << path;
}

TEST_F(ShowTest, AReferenceIsShownAsAPathThatIsFound) {
  auto const object = JsonOf(Run({"show", "X_ToBytes.Id=\"1\"", "--json"}, "hard-to-name"))["object"];
  EXPECT_EQ(object["properties"]["Target"]["value"], "X_Bytes.Id=\"\\xfd\"");
  EXPECT_EQ(Run({"show", object["properties"]["Target"]["value"]}, "hard-to-name").fStatus, 0);
}

TEST_F(ShowTest, AnObjectIsShownWithTypesAndValues) {
  TRun const run = Run({"show", "root/zep/host:CIM_Chassis.CreationClassName=\"CIM_Chassis\",Tag=\"Chassis 0\""});
  EXPECT_EQ(run.fStatus, 0);
  EXPECT_EQ(run.fOutput,
            "root/zep/host:CIM_Chassis.CreationClassName=\"CIM_Chassis\",Tag=\"Chassis 0\"\n"
            "\n"
            "Property                  Type        Value\n"
            "Tag                       string      Chassis 0\n"
            "CreationClassName         string      CIM_Chassis\n"
            "Manufacturer              string      Example Works\n"
            "Version                   string      Rack 2U\n"
            "SerialNumber              string      KQ12345\n"
            "UserTracking              string      RACK-07-U21\n"
            "SKU                       string      1234AB7\n"
            "ChassisPackageType        uint16      23 (SMBIOS Reserved)\n"
            "ChassisTypeDescription    string      Rack Mount Chassis\n"
            "LockPresent               boolean     false\n"
            "Height                    real32      3.5\n"
            "NumberOfPowerCords        uint16      2\n");
}

TEST_F(ShowTest, APathWithoutNamespaceIsSearchedInAllNamespaces) {
  EXPECT_EQ(Run({"show", "CIM_Chassis.CreationClassName=\"CIM_Chassis\",Tag=\"Chassis 0\""}).fStatus, 0);
  EXPECT_EQ(Run({"show", "X_Link.Id=\"1\""}).fStatus, 0);
}

TEST_F(ShowTest, AMissingValueHasAReason) {
  TRun const run = Run({"show",
                        "CIM_Processor.CreationClassName=\"CIM_Processor\",DeviceID=\"Processor 0\","
                        "SystemCreationClassName=\"QRVSG_ComputerSystem\",SystemName=\"db1\""});
  EXPECT_THAT(run.fOutput, HasSubstr("UniqueID                  string      NULL: not set by the firmware (all zeros)\n"));
}

TEST_F(ShowTest, AClassIsShownWithInheritedPropertiesAndItsInstances) {
  TRun const run = Run({"show", "X_Odd"});
  EXPECT_EQ(run.fStatus, 0);
  EXPECT_THAT(run.fOutput, testing::StartsWith("root/test:X_Odd : X_Base\n"
                                               "\n"
                                               "Property                  Type        Key    Default\n"
                                               "Id                        string      key    NULL\n"
                                               "Inherited                 uint8              NULL\n"
                                               "Text                      string             NULL\n"));
  EXPECT_THAT(run.fOutput, HasSubstr("List                      string[]           NULL\n"));
  EXPECT_THAT(run.fOutput, HasSubstr("\nInstances\nroot/test:X_Odd.Id=\"quote \\\" and \\\\ and \\x1b[31m\"\n"));

  auto const object = JsonOf(Run({"show", "root/test:X_Odd", "--json"}))["object"];
  EXPECT_EQ(object["class"], "X_Odd");
  EXPECT_EQ(object["superClass"], "X_Base");
  EXPECT_EQ(object["properties"]["Id"]["key"], true);
  EXPECT_EQ(object["instances"].size(), 1u);
}

TEST_F(ShowTest, AClassWithoutInstancesHasAReason) {
  TCall call;
  call.fArguments = {"show", "CIM_Chassis"};
  call.fEnvironment = {{"ZEP_SMBIOS_TABLE", fZep.Path("nothing")}};
  EXPECT_THAT(fZep.Run(call).fOutput,
              HasSubstr("\nInstances\nnone: the SMBIOS table file " + fZep.Path("nothing") + " does not exist\n"));
}

TEST_F(ShowTest, AReferenceIsShownAsItsPath) {
  auto const object = JsonOf(Run({"show", "X_Link.Id=\"1\"", "--json"}))["object"];
  EXPECT_EQ(object["properties"]["Target"]["type"], "reference");
  EXPECT_EQ(object["properties"]["Target"]["value"], "X_Odd.Id=\"quote \\\" and \\\\ and \x1b[31m\"");
}

TEST_F(ShowTest, AMissingObjectIsAnError) {
  for (std::string const path :
       {"CIM_Nothing", "root/zep/host:CIM_Nothing", "root/other:CIM_Chassis", "CIM_Chassis.Tag=\"Chassis 7\"",
        "CIM_Chassis.Nothing=\"1\"", "CIM_Chassis.Tag=", ":", "root/zep/host:", "\"", "CIM_Chassis.Tag=\"a"}) {
    TRun const run = Run({"show", path});
    EXPECT_EQ(run.fStatus, 1) << path;
    EXPECT_EQ(run.fOutput, "") << path;
    EXPECT_EQ(run.fErrors, "zep: no provider has the object \"" + path + "\"\n");
  }
}

TEST_F(ShowTest, AnObjectWhoseKeysAreReferencesIsFoundByItsPrintedPath) {
  fZep.Add("libClock.nsp.so", CLOCK_PLUGIN);
  std::string const path = "X_RunsAtTheRateOf.Follower=\"X_Clock.Name=\"monotonic\"\",Leader=\"X_Clock.Name=\"realtime\"\"";
  auto const instances = JsonOf(Run({"report", "--json"}))["instances"];
  EXPECT_TRUE(std::any_of(instances.begin(), instances.end(),
                          [&](auto const& instance) { return instance["path"] == "root/clock:" + path; }));
  for (std::string const& given : {"root/clock:" + path, path}) {
    TRun const run = Run({"show", given, "--json"});
    EXPECT_EQ(run.fStatus, 0) << run.fErrors;
    if (run.fStatus != 0) continue;
    EXPECT_EQ(JsonOf(run)["object"]["path"], "root/clock:" + path);
    EXPECT_EQ(JsonOf(run)["object"]["properties"]["Leader"]["value"], "X_Clock.Name=\"realtime\"");
  }
  EXPECT_EQ(Run({"show", "root/test:" + path}).fStatus, 1);
  EXPECT_EQ(Run({"show", "root/clock:X_RunsAtTheRateOf.Follower=\"X_Clock.Name=\"monotonic\"\""}).fStatus, 1);
}

TEST_F(ShowTest, AProviderThatFailedIsNamed) {
  std::string const nothing = "zep: no provider has the object \"X_Odd\"\n";
  EXPECT_EQ(Run({"show", "X_Odd"}, "throws").fErrors, "zep: Test: kZEPStatusAccessDenied (fill, libTest.nsp.so)\n" + nothing);
  EXPECT_EQ(Run({"show", "X_Odd"}, "fails-later").fErrors,
            "zep: Test: it threw an object that is not a std::exception (fill, libTest.nsp.so)\n" + nothing);
  EXPECT_EQ(Run({"show", "X_Odd", "--in-process"}, "fails-later").fErrors, "zep: Test: kZEPStatusFail\n" + nothing);
  WriteFile(fZep.Path("lib/libBroken.nsp.so"), "this is no library");
  EXPECT_EQ(Run({"show", "X_None"}).fErrors,
            "zep: Broken: " + fZep.Path("bin/../lib/libBroken.nsp.so") +
                ": file too short (open, libBroken.nsp.so)\nzep: no provider has the object \"X_None\"\n");
}

TEST_F(ShowTest, AFailedPlugInIsReportedAlsoWhenTheObjectIsFound) {
  WriteFile(fZep.Path("lib/libBroken.nsp.so"), "this is no library");
  std::string const error = fZep.Path("bin/../lib/libBroken.nsp.so") + ": file too short";
  for (char const* command : {"show", "classes"}) {
    std::vector<std::string> arguments = {command};
    if (arguments[0] == "show") arguments.emplace_back("X_Odd");
    TRun const run = Run(arguments);
    EXPECT_EQ(run.fStatus, 2);
    EXPECT_THAT(run.fOutput, HasSubstr("X_Odd"));
    EXPECT_EQ(run.fErrors, "zep: Broken: " + error + " (open, libBroken.nsp.so)\n");
    arguments.emplace_back("--json");
    auto const document = JsonOf(Run(arguments));
    EXPECT_EQ(document["exitStatus"], 2);
    EXPECT_EQ(document["reason"], "Broken: " + error + " (open, libBroken.nsp.so)");
    ASSERT_EQ(document["failedPlugIns"].size(), 1u);
    EXPECT_EQ(document["failedPlugIns"][0]["name"], "Broken");
    EXPECT_EQ(document["failedPlugIns"][0]["error"], error);
    EXPECT_EQ(document["failedPlugIns"][0]["stage"], "open");
  }
}

TEST_F(ShowTest, ClassesNamesANamespaceThatFailsAndShowsTheOthers) {
  TRun const run = Run({"classes", "--json"}, "fails-later");
  EXPECT_EQ(run.fStatus, 2);
  EXPECT_EQ(run.fErrors, "zep: Test: it threw an object that is not a std::exception (fill, libTest.nsp.so)\n");
  EXPECT_EQ(JsonOf(run)["namespaces"].size(), 1u);
  TRun const inProcess = Run({"classes", "--json", "--in-process"}, "fails-later");
  EXPECT_EQ(inProcess.fStatus, 2);
  EXPECT_EQ(inProcess.fErrors, "zep: Test: it threw an object that is not a std::exception\n");
  EXPECT_EQ(JsonOf(inProcess)["namespaces"].size(), 1u);
}

TEST_F(ShowTest, AMissingObjectHasADocument) {
  TRun const run = Run({"show", "X_None", "--json"});
  EXPECT_EQ(run.fStatus, 1);
  EXPECT_EQ(run.fErrors, "zep: no provider has the object \"X_None\"\n");
  EXPECT_EQ(JsonOf(run)["document"], "zep show");
  EXPECT_EQ(JsonOf(run)["version"], 2);
  EXPECT_EQ(JsonOf(run)["exitStatus"], 1);
  EXPECT_EQ(JsonOf(run)["reason"], "no provider has the object \"X_None\"");
}

TEST_F(ShowTest, TheSampleIsLabelled) {
  TRun const run = Run({"show", "--sample", "CIM_Chassis"});
  EXPECT_THAT(run.fOutput, testing::StartsWith("SAMPLE root/zep/host:CIM_Chassis : CIM_PhysicalFrame : "));
  auto const document = JsonOf(Run({"show", "--sample", "--json", "CIM_Chassis"}));
  EXPECT_EQ(document["sample"], true);
  EXPECT_EQ(document["label"], "SAMPLE");
  EXPECT_EQ(document["version"], 2);
}

}  // namespace
}  // namespace NQRVZEP20::zep
