// SPDX-License-Identifier: Apache-2.0

// zep mof, zep classes and zep show over a MOF file, run as users run them.

#include "tests/DmtfSchema.h"
#include "tests/tools/zep/Zep.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

namespace NQRVZEP20::zep {
namespace {

using testing::HasSubstr;

constexpr char kSchema[] =
    "Qualifier Abstract : boolean = false, Scope(class, association, indication), Flavor(Restricted);\n"
    "Qualifier Association : boolean = false, Scope(association);\n"
    "Qualifier Description : string, Scope(any);\n"
    "Qualifier Indication : boolean = false, Scope(class, indication);\n"
    "Qualifier Key : boolean = false, Scope(property, reference), Flavor(DisableOverride);\n"
    "Qualifier Values : string[], Scope(property);\n"
    "Qualifier ValueMap : string[], Scope(property);\n"
    "[Abstract] class X_Device { [Key] uint32 Id; [ValueMap {\"2\", \"5\", \"..\"}, Values {\"Degraded\", \"OK\", \"Other\"}] "
    "uint16 State = 5; uint32 Stop(); };\n"
    "[Description(\"A disk,\\n\\tor what looks like one.\")] class X_Disk : X_Device { uint16 State = 2; "
    "uint32 Reset(boolean Force, X_Disk REF Instead, string Log[]); };\n"
    "[Association] class X_Link { [Key] X_Device REF From; [Key] X_Device REF To; };\n"
    "[Indication, Abstract] class X_Alert { }; class X_Loud : X_Alert { };\n"
    "instance of X_Disk as $D { Id = 1; }; instance of X_Disk { Id = 2; State = 7; };\n"
    "instance of X_Link { From = $D; To = \"X_Disk.Id=2\"; };\n";

class MofTest : public testing::Test {
protected:
  MofTest() { WriteFile(File(), kSchema); }

  std::string File() const { return fZep.Path("disks.mof"); }
  TRun Run(std::vector<std::string> const& arguments) {
    TCall call;
    call.fArguments = arguments;
    call.fEnvironment = {{"ZEP_SMBIOS_TABLE", SamplePath()}, {"ZEP_HOST_NAME", "db1"}};
    call.fDirectory = fZep.Path("");
    return fZep.Run(call);
  }

  TInstallation fZep;
};

// ---- zep mof ----

TEST_F(MofTest, ACorrectSchemaIsCounted) {
  TRun const run = Run({"mof", "disks.mof"});
  EXPECT_EQ(run.fStatus, 0) << run.fErrors;
  EXPECT_EQ(run.fOutput,
            "disks.mof\n"
            "\n"
            "Qualifier declarations    7\n"
            "Classes                   5\n"
            "  associations            1\n"
            "  indications             2\n"
            "  abstract                2\n"
            "Properties                5\n"
            "Methods                   2\n"
            "  parameters              3\n"
            "Instances                 3\n");
}

TEST_F(MofTest, TheCountsAreAvailableAsJson) {
  auto const document = JsonOf(Run({"mof", "--json", "disks.mof"}));
  EXPECT_EQ(document["document"], "zep mof");
  EXPECT_EQ(document["file"], "disks.mof");
  for (auto const& [key, count] : {std::pair("qualifierDeclarations", 7), std::pair("classes", 5), std::pair("associations", 1),
                                   std::pair("indications", 2), std::pair("abstractClasses", 2), std::pair("properties", 5),
                                   std::pair("methods", 2), std::pair("parameters", 3), std::pair("instances", 3)})
    EXPECT_EQ(document[key], count) << key;
}

TEST_F(MofTest, ThePrintedSchemaIsReadAndPrintedIdentically) {
  TRun const first = Run({"mof", "disks.mof", "--print"});
  EXPECT_EQ(first.fStatus, 0);
  EXPECT_THAT(first.fOutput,
              testing::StartsWith("Qualifier Abstract : boolean = FALSE,\n    Scope(class, association, indication)"));
  EXPECT_THAT(first.fOutput, HasSubstr("[Association]\nclass X_Link {\n\n  [Key]\n  X_Device REF From;\n"));
  WriteFile(fZep.Path("printed.mof"), first.fOutput);
  EXPECT_EQ(Run({"mof", "printed.mof", "--print"}).fOutput, first.fOutput);
}

TEST_F(MofTest, AMistakeIsReportedWithItsPlace) {
  WriteFile(fZep.Path("bad.mof"), "class X_A {\n  strin Name;\n};\n");
  TRun const run = Run({"mof", "bad.mof"});
  EXPECT_EQ(run.fStatus, 1);
  EXPECT_EQ(run.fOutput, "");
  EXPECT_EQ(run.fErrors, "zep: bad.mof:2:9: expected \"REF\" after \"strin\", which is not a type, found \"Name\"\n");

  WriteFile(fZep.Path("bad.mof"), "class \x1b[31m");
  EXPECT_EQ(Run({"mof", "bad.mof"}).fErrors, "zep: bad.mof:1:7: unexpected character\n");
  EXPECT_EQ(Run({"mof", "none.mof"}).fErrors, "zep: none.mof: cannot be read: No such file or directory\n");
  EXPECT_EQ(Run({"mof", "none.mof"}).fStatus, 1);
}

TEST_F(MofTest, WrongUsageAndWrongSchemasHaveDifferentStatuses) {
  EXPECT_EQ(Run({"mof"}).fStatus, 64);
  EXPECT_EQ(Run({"mof", "disks.mof", "--print", "--json"}).fStatus, 64);
  EXPECT_EQ(Run({"classes", "--mof"}).fStatus, 64);
  EXPECT_EQ(Run({"classes", "--sample", "--mof", "disks.mof"}).fStatus, 64);
  EXPECT_EQ(Run({"show", "--sample", "--mof", "disks.mof", "X_Disk"}).fStatus, 64);
  for (char const* command : {"mof", "classes", "show"}) {
    TRun const help = Run({command, "--help"});
    EXPECT_EQ(help.fStatus, 0);
    EXPECT_THAT(help.fOutput, HasSubstr("Exit status: 0 when "));
  }
}

// ---- zep classes ----

TEST_F(MofTest, ClassesAreListed) {
  TRun const run = Run({"classes", "--mof", "disks.mof"});
  EXPECT_EQ(run.fStatus, 0);
  EXPECT_EQ(run.fOutput,
            "mof (disks.mof): 5 classes\n"
            "\n"
            "Class                                 Superclass                    Kind\n"
            "X_Device                                                            abstract\n"
            "X_Disk                                X_Device\n"
            "X_Link                                                              association\n"
            "X_Alert                                                             abstract\n"
            "                                                                    indication\n"
            "X_Loud                                X_Alert                       indication\n");
}

TEST_F(MofTest, ClassesAreATree) {
  EXPECT_EQ(Run({"classes", "--tree", "--mof", "disks.mof"}).fOutput,
            "mof (disks.mof): 5 classes\n"
            "\n"
            "X_Device (abstract)\n"
            "  X_Disk\n"
            "X_Link (association)\n"
            "X_Alert (abstract indication)\n"
            "  X_Loud (indication)\n");
}

TEST_F(MofTest, ClassesAreAvailableAsJson) {
  auto const namespaces = JsonOf(Run({"classes", "--json", "--mof", "disks.mof"}))["namespaces"];
  ASSERT_EQ(namespaces.size(), 1u);
  EXPECT_EQ(namespaces[0]["provider"], "disks.mof");
  EXPECT_EQ(namespaces[0]["namespace"], "mof");
  auto const classes = namespaces[0]["classes"];
  ASSERT_EQ(classes.size(), 5u);
  EXPECT_EQ(classes[0], nlohmann::json::parse(R"({"name": "X_Device", "superClass": null, "abstract": true,
                                                  "association": false, "indication": false, "depth": 0})"));
  EXPECT_EQ(classes[4], nlohmann::json::parse(R"({"name": "X_Loud", "superClass": "X_Alert", "abstract": false,
                                                  "association": false, "indication": true, "depth": 1})"));
}

TEST_F(MofTest, ClassesOfProvidersAreListed) {
  TRun const run = Run({"classes"});
  EXPECT_EQ(run.fStatus, 0);
  EXPECT_THAT(run.fOutput, testing::StartsWith("root/zep/host (Host): "));
  EXPECT_THAT(run.fOutput, HasSubstr("\nCIM_Chassis                            CIM_PhysicalFrame\n"));
  EXPECT_THAT(Run({"classes", "--sample"}).fOutput, testing::StartsWith("SAMPLE root/zep/host (Host): "));
}

TEST_F(MofTest, WithAFailedPlugInTheListIsPartial) {
  fZep.Add("libBroken.nsp.so", File());
  TRun const run = Run({"classes"});
  EXPECT_EQ(run.fStatus, 2);
  EXPECT_THAT(run.fErrors, HasSubstr("zep: Broken: "));
  EXPECT_THAT(run.fOutput, HasSubstr("\nCIM_Chassis                            CIM_PhysicalFrame\n"));
  fZep.Remove("libHost.nsp.so");
  EXPECT_EQ(Run({"classes"}).fStatus, 1);
}

TEST_F(MofTest, ASchemaWithoutClassesIsAnError) {
  WriteFile(fZep.Path("empty.mof"), "// nothing\n");
  TRun const run = Run({"classes", "--mof", "empty.mof"});
  EXPECT_EQ(run.fStatus, 1);
  EXPECT_EQ(run.fOutput, "");
  EXPECT_EQ(run.fErrors, "zep: no class was found\n");
}

// ---- zep show ----

TEST_F(MofTest, AClassIsShownWithItsValuesInWordsAndItsMethods) {
  TRun const run = Run({"show", "X_Disk", "--mof", "disks.mof"});
  EXPECT_EQ(run.fStatus, 0);
  EXPECT_EQ(run.fOutput,
            "mof:X_Disk : X_Device\n"
            "\n"
            "A disk,\n"
            " or what looks like one.\n"
            "\n"
            "Property                  Type        Key    Default\n"
            "Id                        uint32      key    NULL\n"
            "State                     uint16             2 (Degraded)\n"
            "\n"
            "Values\n"
            "State                     2 (Degraded), 5 (OK), .. (Other)\n"
            "\n"
            "Methods\n"
            "uint32 Stop()\n"
            "uint32 Reset(boolean Force, reference to X_Disk Instead, string[] Log)\n"
            "\n"
            "Instances\n"
            "mof:X_Disk.Id=\"1\"\n"
            "mof:X_Disk.Id=\"2\"\n");
  auto const object = JsonOf(Run({"show", "X_Disk", "--mof", "disks.mof", "--json"}))["object"];
  EXPECT_EQ(object["properties"]["State"]["values"][1], nlohmann::json::parse(R"({"value": "5", "word": "OK"})"));
  EXPECT_FALSE(object["properties"]["Id"].contains("values"));
  EXPECT_EQ(object["methods"][0], "uint32 Stop()");
}

TEST_F(MofTest, AnInstanceIsShownWithItsValuesInWords) {
  EXPECT_EQ(Run({"show", "mof:X_Disk.Id=\"2\"", "--mof", "disks.mof"}).fOutput,
            "mof:X_Disk.Id=\"2\"\n"
            "\n"
            "Property                  Type        Value\n"
            "Id                        uint32      2\n"
            "State                     uint16      7 (Other)\n");
  auto const state = JsonOf(Run({"show", "X_Disk.Id=\"1\"", "--mof", "disks.mof", "--json"}))["object"]["properties"]["State"];
  EXPECT_EQ(state["value"], 2);
  EXPECT_EQ(state["words"], "Degraded");
}

TEST_F(MofTest, AnUndeclaredObjectIsAnError) {
  TRun const run = Run({"show", "X_Tape", "--mof", "disks.mof"});
  EXPECT_EQ(run.fStatus, 1);
  EXPECT_EQ(run.fErrors, "zep: disks.mof has no object \"X_Tape\"\n");
}

TEST_F(MofTest, AFailureIsAlsoPrintedAsADocument) {
  std::vector<std::vector<std::string>> const calls = {
      {"mof", "--json", "none.mof"}, {"classes", "--json", "--mof", "none.mof"}, {"show", "--json", "X", "--mof", "none.mof"}};
  std::string const why = "none.mof: cannot be read: No such file or directory";
  for (auto const& call : calls) {
    SCOPED_TRACE(call.front());
    TRun const run = Run(call);
    EXPECT_EQ(run.fStatus, 1);
    EXPECT_EQ(run.fErrors, "zep: " + why + "\n");
    EXPECT_EQ(JsonOf(run), (nlohmann::json{{"document", "zep " + call.front()},
                                           {"version", 2},
                                           {"zep", TEST_VERSION},
                                           {"sample", false},
                                           {"exitStatus", 1},
                                           {"reason", why}}));
  }
}

// ---- The documentation ----

// The blocks of docs/schemas.md that begin with "$ zep", each with its first line.
std::vector<std::string> ConsoleBlocks() {
  std::vector<std::string> blocks;
  std::string const page = ReadFile(SourcePath("docs/schemas.md"));
  std::string const fence = "```console\n";
  for (std::size_t at = page.find(fence); at != page.npos; at = page.find(fence, at + 1)) {
    std::size_t const start = at + fence.size();
    blocks.push_back(page.substr(start, page.find("```", start) - start));
  }
  return blocks;
}

TEST_F(MofTest, ThePageOnSchemasShowsTheActualOutput) {
  auto const blocks = ConsoleBlocks();
  ASSERT_EQ(blocks.size(), 2u);
  TCall call;
  call.fArguments = {"mof", "examples/Disks/disks.mof"};
  call.fDirectory = SourcePath();
  EXPECT_EQ(blocks[0], "$ zep mof examples/Disks/disks.mof\n" + fZep.Run(call).fOutput);

  fZep.Add("libDisks.nsp.so", DISKS_PLUGIN);
  fZep.Add("disks.mof", SourcePath("examples/Disks/disks.mof"));
  EXPECT_EQ(blocks[1], "$ zep show 'X_Disk.Name=\"sda\"'\n" + Run({"show", "X_Disk.Name=\"sda\""}).fOutput);
}

TEST_F(MofTest, AProviderWhoseSchemaIsWrongIsReportedWithThePlace) {
  fZep.Add("libDisks.nsp.so", DISKS_PLUGIN);
  WriteFile(fZep.Path("lib/disks.mof"), "class X_Disk {");
  TRun const run = Run({"classes"});
  EXPECT_EQ(run.fStatus, 2);
  EXPECT_THAT(run.fErrors, testing::StartsWith("zep: Disks: "));
  EXPECT_THAT(run.fErrors, testing::EndsWith("/disks.mof:1:15: expected a type, a class and \"REF\", or \"}\", found the end of "
                                             "the file (fill, libDisks.nsp.so)\n"));
}

// ---- The real schema ----

TEST_F(MofTest, TheRealSchemaIsCountedAndShown) {
  NEEDS(!DmtfArchive().empty(), kNoDmtfSchema);
  TDmtfSchema const schema;
  auto const counts = JsonOf(Run({"mof", "--json", schema.MainFile()}));
  EXPECT_EQ(counts["classes"], 1631);
  EXPECT_EQ(counts["indications"], 24);
  TRun const tree = Run({"classes", "--tree", "--mof", schema.MainFile()});
  EXPECT_THAT(tree.fOutput, HasSubstr("\n                  CIM_VTOCDiskPartition\n"));  // nine levels below the root
  TRun const shown = Run({"show", "CIM_ManagedSystemElement", "--mof", schema.MainFile()});
  EXPECT_THAT(shown.fOutput, HasSubstr("\nHealthState               0 (Unknown), 5 (OK), 10 (Degraded/Warning)"));
}

}  // namespace
}  // namespace NQRVZEP20::zep
