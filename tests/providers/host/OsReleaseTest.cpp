// SPDX-License-Identifier: Apache-2.0
#include "providers/host/HostRecords.h"
#include "providers/host/OsRelease.h"
#include "tests/Support.h"
#include "tests/providers/host/KernelTree.h"
#include "tests/providers/host/Structures.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

namespace NQRVZEP20 {
namespace {

using testing::ElementsAre;
using testing::IsEmpty;
using testing::Pair;

constexpr char const* kDebian = R"os(PRETTY_NAME="Debian GNU/Linux 12 (bookworm)"
NAME="Debian GNU/Linux"
VERSION_ID="12"
VERSION="12 (bookworm)"
ID=debian
)os";

TEST(OsReleaseTest, AssignmentsAreReadAsByAShell) {
  struct TRow {
    char const* fLine;
    char const* fValue;
  } const rows[] = {
      {"A=word", "word"},
      {"A=\"two words\"", "two words"},
      {"A='single $quotes \\'", "single $quotes \\"},
      {R"(A="a \"quote\", a \\, a \$, a \` and a \n")", R"(a "quote", a \, a $, a ` and a \n)"},
      {"  A=indented", "indented"},
      {"A=trailing blanks \t", "trailing blanks"},
      {"A=carriage return\r", "carriage return"},
      {"A=\"quoted\" # and more", "quoted"},
      {"A=\"never closed", "never closed"},
      {"A=", ""},
      {"A=\"\"", ""},
      {"A=1=2", "1=2"},
      {"A=\"ends in \\", "ends in \\"},
  };
  for (TRow const& row : rows) {
    SCOPED_TRACE(row.fLine);
    EXPECT_THAT(ParseOsRelease(row.fLine), ElementsAre(Pair("A", row.fValue)));
    EXPECT_THAT(ParseOsRelease(std::string("\n# comment\n") + row.fLine + "\n\n"), ElementsAre(Pair("A", row.fValue)));
  }
}

TEST(OsReleaseTest, OtherLinesAreIgnoredAndTheLastAssignmentCounts) {
  EXPECT_THAT(ParseOsRelease("# A=1\n   \nno assignment\nB=1\nB=2"), ElementsAre(Pair("B", "2")));
  EXPECT_THAT(ParseOsRelease(""), IsEmpty());
}

TEST(OsReleaseTest, TheFirstNameWithAValueIsTaken) {
  TOsRelease const release("/etc/os-release", "VERSION=\nVERSION_ID=12\nBUILD_ID=rolling\n");
  EXPECT_EQ(*release.Value({"VERSION", "VERSION_ID", "BUILD_ID"}), "12");
  EXPECT_EQ(release.Value({"NAME", "ID"}).Why().fCode, "not-given");
  EXPECT_EQ(release.Value({"NAME", "ID"}).Why().fReason, "/etc/os-release contains no NAME");
}

TEST(OsReleaseTest, WithoutAFileEveryValueIsUnreadable) {
  TOsRelease const release("", "");
  EXPECT_EQ(release.Value({"NAME"}).Why().fCode, "unreadable");
  EXPECT_EQ(release.Value({"NAME"}).Why().fReason, "neither /etc/os-release nor /usr/lib/os-release can be read");
}

TEST(OsReleaseTest, ThisMachineHasAFileWithAName) {
  TOsRelease const release = TOsRelease::ReadFrom(TMachineFiles("/"));
  if (release.GetFile().empty()) GTEST_SKIP() << "this machine has no os-release file";
  auto const name = release.Value({"NAME"});
  ASSERT_TRUE(name);
  EXPECT_NE(ReadFile(release.GetFile()).find(*name), std::string::npos);
}

TKernelNames KernelOf(std::string const& node) {
  return {"uname", std::string("Linux"), node, std::string("6.1.0-56-amd64"), std::string("#1 SMP"), std::string("x86_64")};
}

// The record of a system with this os-release text, whose other files are below `root`.
TRecord RecordOf(TOsRelease const& release, TTempDir const& root) {
  TMachineFiles const files(root.Path());
  return OperatingSystemRecord(release, KernelOf("db1"), TMemInfo::ReadFrom(files, "/proc/meminfo"), files,
                               TSystemName{"db1", "uname"});
}

TEST(OsReleaseTest, TheOperatingSystemIsDescribedByItsFileAndItsKernel) {
  TTempDir const root;
  TKernelTree const tree(root.Path());
  tree.Write("/proc/stat", "cpu 1 2\nbtime 1700000000");
  tree.Write("/proc/uptime", "3600.71 7000.00");
  tree.Write("/proc/17/stat", "");
  tree.Write("/proc/meminfo", "MemTotal: 100 kB\nMemFree: 40 kB\nSwapTotal: 20 kB\nSwapFree: 10 kB");
  TRecord const record = RecordOf(TOsRelease("/usr/lib/os-release", kDebian), root);
  EXPECT_EQ(record.GetClassName(), "QRVSG_OperatingSystem");

  struct TRow {
    char const *fName, *fValue, *fSource;
    bool fIsKey;
  } const rows[] = {
      {"CSCreationClassName", "string QRVSG_ComputerSystem", "", true},
      {"CSName", "string db1", "", true},
      {"CreationClassName", "string QRVSG_OperatingSystem", "", true},
      {"Name", "string Debian GNU/Linux", "/usr/lib/os-release", true},
      {"Caption", "string Debian GNU/Linux 12 (bookworm)", "/usr/lib/os-release", false},
      {"Version", "string 12 (bookworm)", "/usr/lib/os-release", false},
      {"OSType", "string Linux", "uname", false},
      {"KernelRelease", "string 6.1.0-56-amd64", "uname", false},
      {"KernelVersion", "string #1 SMP", "uname", false},
      {"Architecture", "string x86_64", "uname", false},
      {"LastBootUpTime", "datetime 20231114221320.000000+000", "/proc/stat", false},
      {"LocalDateTime", "datetime 20231114231320.000000+000", "/proc/stat, /proc/uptime", false},
      {"NumberOfProcesses", "uint32 1", "/proc", false},
      {"TotalVisibleMemorySize", "uint64 100", "/proc/meminfo", false},
      {"FreePhysicalMemory", "uint64 40", "/proc/meminfo", false},
      {"TotalSwapSpaceSize", "uint64 20", "/proc/meminfo", false},
      {"FreeSpaceInPagingFiles", "uint64 10", "/proc/meminfo", false},
      {"TotalVirtualMemorySize", "uint64 120", "/proc/meminfo", false},
      {"FreeVirtualMemory", "uint64 50", "/proc/meminfo", false},
  };
  ASSERT_EQ(record.GetProperties().size(), std::size(rows));
  for (std::size_t at = 0; at < std::size(rows); ++at) {
    SCOPED_TRACE(rows[at].fName);
    TRecordProperty const& property = record.GetProperties()[at];
    EXPECT_EQ(property.fName, rows[at].fName);
    EXPECT_EQ(PropertyOf(record, rows[at].fName), rows[at].fValue);
    EXPECT_EQ(property.fSource, rows[at].fSource);
    EXPECT_EQ(property.fIsKey, rows[at].fIsKey);
  }
}

TEST(OsReleaseTest, ASystemWithoutVersionHasItsBuildInstead) {
  TTempDir const root;
  auto const version = [&](std::string const& text) {
    return PropertyOf(RecordOf(TOsRelease("/etc/os-release", text), root), "Version");
  };
  EXPECT_EQ(version("NAME=R\nBUILD_ID=rolling\n"), "string rolling");
  EXPECT_EQ(version("NAME=R\nVERSION_ID=39\nBUILD_ID=x\n"), "string 39");
  EXPECT_EQ(version("NAME=R\n"), "string NULL not-given: /etc/os-release contains no VERSION");
}

TEST(OsReleaseTest, TheEnvironmentMayNameTheMachine) {
  TEnvironmentGuard const unset("ZEP_HOST_NAME", nullptr);
  EXPECT_EQ(*SystemNameOf(KernelOf("db1")).fName, "db1");
  EXPECT_EQ(SystemNameOf(KernelOf("db1")).fSource, "uname");
  TEnvironmentGuard const empty("ZEP_HOST_NAME", "");
  EXPECT_EQ(*SystemNameOf(KernelOf("db1")).fName, "db1");
  TEnvironmentGuard const named("ZEP_HOST_NAME", "other");
  EXPECT_EQ(*SystemNameOf(KernelOf("db1")).fName, "other");
  EXPECT_EQ(SystemNameOf(KernelOf("db1")).fSource, "ZEP_HOST_NAME");
  EXPECT_EQ(*SystemNameOf(KernelOf("(none)")).fName, "other") << "instead of a placeholder";
}

TEST(OsReleaseTest, TheCollectorReportsItsVersionAndBuild) {
  TRecord const record = ProductRecord();
  EXPECT_EQ(record.GetClassName(), "QRVSG_ZEPProduct");
  EXPECT_EQ(PropertyOf(record, "Name"), "string zepcore");
  EXPECT_EQ(PropertyOf(record, "Version"), "string " TEST_VERSION);
  EXPECT_EQ(PropertyOf(record, "Build"), "string " TEST_BUILD_ID);
}

}  // namespace
}  // namespace NQRVZEP20
