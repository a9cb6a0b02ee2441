// SPDX-License-Identifier: Apache-2.0

// zep plugin new: the project that it writes, and what it refuses. tests/packaging/new-plugin-test.sh builds a project.

#include "tests/DmtfSchema.h"
#include "tests/tools/zep/Envelope.h"
#include "tests/tools/zep/Zep.h"

#include <gmock/gmock.h>

namespace NQRVZEP20::zep {
namespace {

using testing::ElementsAre;
using testing::EndsWith;
using testing::HasSubstr;

constexpr char kMof[] =
    R"(Qualifier Abstract : boolean = false, Scope(class, association, indication), Flavor(EnableOverride, Restricted);
Qualifier Association : boolean = false, Scope(association), Flavor(DisableOverride, ToSubclass);
Qualifier Key : boolean = false, Scope(property, reference), Flavor(DisableOverride, ToSubclass);
[Abstract] class X_Device { [Key] string Name; };
class X_Disk : X_Device { uint16 State; };
[Abstract] class X_Idea { string Name; };
[Association] class X_Holds { [Key] X_Disk REF One; [Key] X_Disk REF Other; };
)";

class PluginTest : public testing::Test {
protected:
  PluginTest() {
    fs::create_directory(fZep.Path("work"));
    WriteFile(fZep.Path("work/disks.mof"), kMof);
  }

  TRun Run(std::vector<std::string> const& arguments, std::map<std::string, std::string> const& environment = {}) {
    TCall call = {arguments};
    call.fEnvironment = environment;
    call.fEnvironment.emplace("ZEP_DMTF_SCHEMA", "");
    call.fDirectory = fZep.Path("work");
    return fZep.Run(call);
  }

  void ExpectRefused(std::vector<std::string> const& arguments, int status, std::string const& why) {
    SCOPED_TRACE(testing::PrintToString(arguments));
    TRun const run = Run(arguments);
    EXPECT_EQ(run.fStatus, status);
    EXPECT_EQ(run.fOutput, "");
    EXPECT_EQ(run.fErrors, "zep: " + why + "\n");
    EXPECT_FALSE(fs::exists(fZep.Path("work/Drives")));
  }

  std::string Written(std::string const& file) { return ReadFile(fZep.Path("work/Drives/" + file)); }

  TInstallation fZep;
};

TEST_F(PluginTest, TheProjectHasTheClassAndNamesThePlugIn) {
  TRun const run = Run({"plugin", "new", "Drives", "--class", "x_disk", "--mof", "disks.mof"});
  EXPECT_EQ(run.fStatus, 0) << run.fErrors;
  EXPECT_EQ(run.fOutput,
            "Drives/ has the project of a plug-in for X_Disk: CMakeLists.txt, Drives.cpp, Drives.mof, DrivesTest.cpp, README.md\n"
            "Next: cd Drives && cmake -B build && cmake --build build && ctest --test-dir build\n");
  EXPECT_THAT(Written("CMakeLists.txt"), HasSubstr("zep_add_provider(Drives Drives.cpp MOF Drives.mof)\n"));
  EXPECT_THAT(Written("Drives.cpp"), HasSubstr("  values.Set(\"Name\", \"example\");\n"));
  EXPECT_THAT(Written("Drives.cpp"), HasSubstr("  // State, uint16\n  values.Set(\"State\", TCIMValue());\n"));
  EXPECT_THAT(Written("Drives.cpp"), HasSubstr("(\"Drives\", \"root/drives\", FillNamespace)"));
  EXPECT_THAT(Written("Drives.mof"),
              testing::StartsWith("// The class X_Disk and all that it needs, without methods, from disks.mof.\n\n"));
  EXPECT_THAT(Written("Drives.mof"), EndsWith("class X_Disk : X_Device {\n\n  uint16 State;\n};\n\n"));
  EXPECT_EQ(LinesOf(Written("README.md")).size(), 10u);
  for (char const* file : {"CMakeLists.txt", "Drives.cpp", "DrivesTest.cpp", "README.md"})
    for (char const* place : {"@NAME@", "@CLASS@", "@NAMESPACE@", "@SCHEMA@", "@VALUES@"})
      EXPECT_EQ(Written(file).find(place), std::string::npos) << file << " " << place;
}

TEST_F(PluginTest, TheDocumentNamesWhatWasWritten) {
  TRun const run = Run({"plugin", "new", "Drives", "--class", "X_Disk", "--mof", "disks.mof", "--json"});
  ExpectEnvelope(run.fOutput, 0, "zep plugin new");
  auto const document = JsonOf(run);
  EXPECT_EQ(document["directory"], "Drives");
  EXPECT_EQ(document["class"], "X_Disk");
  EXPECT_EQ(document["namespace"], "root/drives");
  EXPECT_EQ(document["schema"], "disks.mof");
  EXPECT_EQ(document["files"], nlohmann::json({"CMakeLists.txt", "Drives.cpp", "Drives.mof", "DrivesTest.cpp", "README.md"}));
}

TEST_F(PluginTest, ANameThatNoPlugInCanHaveIsWrongUsage) {
  std::string const form =
      "the name of a plug-in consists of at most 64 letters, digits and underscores, and begins with a letter";
  for (std::string const& name :
       {std::string("a/b"), std::string("../a"), std::string("."), std::string("1a"), std::string("a-b"), std::string("a b"),
        std::string("_a"), std::string("\xc3\xa4"), std::string(65, 'a')})
    ExpectRefused({"plugin", "new", name, "--class", "X_Disk", "--mof", "disks.mof"}, 64, form);
  ExpectRefused({"plugin", "new", "test", "--class", "X_Disk", "--mof", "disks.mof"}, 64,
                "\"test\" is a target of CMake; choose another name");
  ExpectRefused({"plugin", "new", "Host", "--class", "X_Disk", "--mof", "disks.mof"}, 64,
                "the plug-in " + fs::canonical(fZep.Path("lib")).string() +
                    "/libHost.nsp.so exists already, and a host uses only one of a name; choose another name");
}

TEST_F(PluginTest, WhatExistsIsNotTouched) {
  for (char const* kind : {"directory", "file", "link"}) {
    SCOPED_TRACE(kind);
    std::string const path = fZep.Path("work/There");
    if (*kind == 'd') fs::create_directory(path);
    if (*kind == 'f') WriteFile(path, "text");
    if (*kind == 'l') fs::create_symlink("nowhere", path);
    ExpectRefused({"plugin", "new", "There", "--class", "X_Disk", "--mof", "disks.mof"}, 1,
                  "There exists already; remove it, or choose another name");
    EXPECT_NE(fs::symlink_status(path).type(), fs::file_type::not_found);
    fs::remove(path);
  }
}

TEST_F(PluginTest, AClassWithoutObjectsOfItsOwnIsRefused) {
  auto const refuse = [this](std::string const& cls, std::string const& why) {
    ExpectRefused({"plugin", "new", "Drives", "--class", cls, "--mof", "disks.mof"}, 1, why);
  };
  refuse("X_Dsk", "there is no class X_Dsk in disks.mof; similar names: X_Disk");
  refuse("CIM_Processor", "there is no class CIM_Processor in disks.mof; zep classes --mof lists the classes of a schema");
  refuse("X_Device", "X_Device is abstract and has no objects of its own; choose a class below it, such as X_Disk");
  refuse("X_Idea", "X_Idea is abstract and has no objects of its own; declare a class below it in a MOF file, which --mof names");
  refuse(
      "X_Holds",
      "X_Holds is an association, whose objects refer to objects of other classes; make a plug-in for one of these classes, and "
      "add the association to it");
}

TEST_F(PluginTest, ASchemaThatCannotBeReadIsNamed) {
  WriteFile(fZep.Path("work/bad.mof"), "class\n");
  TRun const bad = Run({"plugin", "new", "Drives", "--class", "X_Disk", "--mof", "bad.mof"});
  EXPECT_EQ(bad.fStatus, 1);
  EXPECT_THAT(bad.fErrors, testing::StartsWith("zep: bad.mof:2:1: "));
  EXPECT_FALSE(fs::exists(fZep.Path("work/Drives")));
}

TEST_F(PluginTest, ADirectoryThatCannotBeWrittenIsNamed) {
  fs::permissions(fZep.Path("work"),
                  fs::perms::owner_read | fs::perms::owner_exec | fs::perms::others_read | fs::perms::others_exec);
  TCall call = {{"plugin", "new", "Drives", "--class", "X_Disk", "--mof", "disks.mof"}};
  call.fAsNobody = true;
  call.fDirectory = fZep.Path("work");
  TRun const run = fZep.Run(call);
  EXPECT_EQ(run.fStatus, 1);
  EXPECT_EQ(run.fErrors, "zep: Drives cannot be created: Permission denied\n");
}

TEST_F(PluginTest, WithoutMofTheSchemaIsSearched) {
  std::vector<std::string> const call = {"plugin", "new", "Drives", "--class", "X_Disk"};
  std::string const share = fs::canonical(fZep.Path("share/zepcore")).string() + "/schema";
  ExpectRefused(call, 1,
                "there is no schema; name a MOF file with --mof, or unpack the DMTF CIM schema and name its directory in "
                "ZEP_DMTF_SCHEMA, or unpack it to " +
                    share);

  fs::create_directory(fZep.Path("dmtf"));
  TRun const empty = Run(call, {{"ZEP_DMTF_SCHEMA", fZep.Path("dmtf")}});
  EXPECT_EQ(empty.fErrors,
            "zep: " + fZep.Path("dmtf") +
                ", which ZEP_DMTF_SCHEMA names, has no file cim_schema_VERSION.mof; unpack the archive of the DMTF CIM "
                "schema there, or name a MOF file with --mof\n");

  WriteFile(fZep.Path("dmtf/cim_schema_2.49.0.mof"), kMof);
  EXPECT_EQ(Run(call, {{"ZEP_DMTF_SCHEMA", fZep.Path("dmtf")}}).fStatus, 0);
  EXPECT_THAT(Written("Drives.mof"), HasSubstr("from cim_schema_2.49.0.mof.\n// CIM Schema, Copyright (c) DMTF."));
  fs::remove_all(fZep.Path("work/Drives"));

  EXPECT_EQ(Run(call, {{"ZEP_DMTF_SCHEMA", fZep.Path("work/disks.mof")}}).fStatus, 0);
  fs::remove_all(fZep.Path("work/Drives"));

  fs::create_directory(share);
  WriteFile(share + "/cim_schema_2.50.0.mof", kMof);
  EXPECT_EQ(Run(call).fStatus, 0);
}

TEST_F(PluginTest, AClassOfTheDmtfMakesAProject) {
  if (DmtfArchive().empty()) GTEST_SKIP() << "needs " << kNoDmtfSchema;
  TDmtfSchema const schema;
  ASSERT_TRUE(schema.IsThere());
  TRun const run = Run({"plugin", "new", "Drives", "--class", "CIM_DiskDrive"}, {{"ZEP_DMTF_SCHEMA", schema.MainFile()}});
  EXPECT_EQ(run.fStatus, 0) << run.fErrors;
  EXPECT_THAT(Written("Drives.cpp"), HasSubstr("  values.Set(\"CreationClassName\", \"CIM_DiskDrive\");\n"));
  EXPECT_EQ(Run({"show", "CIM_DiskDrive", "--mof", "Drives/Drives.mof"}).fStatus, 0);
}

}  // namespace
}  // namespace NQRVZEP20::zep
