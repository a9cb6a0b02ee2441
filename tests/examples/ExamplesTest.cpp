// SPDX-License-Identifier: Apache-2.0

// The examples do what the documentation says, and the documentation shows the code of the examples.

#include "TOSSpecific.h"
#include "TReasonReader.h"
#include "tests/Support.h"
#include "zepcore.h"

#include <gmock/gmock.h>

#include <cstdio>
#include <filesystem>
#include <memory>
#include <regex>
#include <sstream>

namespace NQRVZEP20 {
namespace {

TCIMContext const kNone;

std::string SourceFile(std::string const& name) { return ReadFile(SourcePath(name)); }

std::string OutputOf(std::string const& command) {
  std::unique_ptr<FILE, int (*)(FILE*)> const pipe(::popen(command.c_str(), "r"), ::pclose);
  std::string output;
  for (int c; (c = std::fgetc(pipe.get())) != EOF;) output += static_cast<char>(c);
  return output;
}

// ---- The plug-in ----

class ClockTest : public testing::Test {
protected:
  static void SetUpTestSuite() { TOSSpecific::LoadPluginLibrary(ZEP_CLOCK_PLUGIN); }

  ClockTest() : fNs(TRootObject::GetNamespaceProviderManager()->GetNamespaceProvider("Clock")->GetNamespace(kNone)) {}

  boost::shared_ptr<ICIMInstance> Find(std::string const& path) const {
    return fNs->GetInstance(TCIMReference(fNs, "ns:" + path, kNone), kNone);
  }

  boost::shared_ptr<ICIMNamespace> const fNs;
};

TEST_F(ClockTest, RegistersItselfWithItsNamespace) {
  EXPECT_EQ(fNs->GetName(kNone), "root/clock");
  EXPECT_EQ(TRootObject::GetNamespaceProviderManager()->GetNamespaceProvider("Clock")->GetNamespace(kNone), fNs);
}

TEST_F(ClockTest, EachClockHasAnInstance) {
  for (char const* name : {"realtime", "monotonic", "boottime"}) {
    SCOPED_TRACE(name);
    auto const clock = Find("X_Clock.Name=\"" + std::string(name) + "\"");
    ASSERT_TRUE(clock);
    EXPECT_EQ(clock->GetClass(kNone)->GetSuperClass(kNone)->GetName(kNone), "X_TimeSource");
    unsigned long const seconds = clock->GetProperty("Seconds", kNone)->GetValue(kNone);
    EXPECT_GT(seconds, 0u);
    unsigned long const resolution = clock->GetProperty("ResolutionNanoseconds", kNone)->GetValue(kNone);
    EXPECT_GT(resolution, 0u);
    unsigned short const kind = clock->GetProperty("Kind", kNone)->GetValue(kNone);
    EXPECT_EQ(kind, std::string(name) == "realtime" ? 1 : 2);
  }
}

TEST_F(ClockTest, AssociatesClocks) {
  std::vector<boost::shared_ptr<ICIMInstance>> associations;
  fNs->GetClass("X_RunsAtTheRateOf", kNone)->EnumerateInstances(TAddToVectorCallback<ICIMInstance>(associations), kNone);
  ASSERT_EQ(associations.size(), 1u);
  TCIMReference const leader = associations[0]->GetProperty("Leader", kNone)->GetValue(kNone);
  EXPECT_EQ(leader.GetCIMElement(false), Find("X_Clock.Name=\"realtime\""));
  EXPECT_TRUE(associations[0]->GetClass(kNone)->GetClassFlag(kNone));
}

// ---- The plug-in with reasons ----

TEST(BatteriesTest, EachValueHasASourceOrAReason) {
  TTempDir const dir;
  for (char const* name : {"BAT0", "BAT1"}) std::filesystem::create_directory(dir.Path(name));
  WriteFile(dir.Path("BAT0/capacity"), "97\n");
  WriteFile(dir.Path("BAT1/capacity"), "full\n");
  TEnvironmentGuard const directory("EXAMPLE_BATTERIES", dir.Path().c_str());
  TOSSpecific::LoadPluginLibrary(ZEP_BATTERIES_PLUGIN);
  auto const ns = TRootObject::GetNamespaceProviderManager()->GetNamespaceProvider("Batteries")->GetNamespace(kNone);
  auto const find = [&](char const* path) { return ns->GetInstance(TCIMReference(ns, std::string("ns:") + path, kNone), kNone); };

  auto const first = find("X_Battery.Name=\"BAT0\""), second = find("X_Battery.Name=\"BAT1\"");
  ASSERT_TRUE(first && second);
  unsigned short const charge = first->GetProperty("Charge", kNone)->GetValue(kNone);
  EXPECT_EQ(charge, 97);

  TReasonReader const reasons(*ns);
  EXPECT_FALSE(reasons.WhyMissing(*first, "Charge"));
  EXPECT_EQ(reasons.WhyMissing(*first, "Model").value().fReason, dir.Path("BAT0/model_name") + " cannot be read");
  EXPECT_EQ(reasons.WhyMissing(*second, "Charge").value().fCode, "unexpected-form");
  EXPECT_EQ(reasons.WhyMissing(*second, "Charge").value().fReason, "\"full\" is not a percentage");
  EXPECT_EQ(TReasonReader::SourceOf(*ns->GetClass("X_Battery", kNone)->GetPropertyDecl("Charge", kNone)), "sysfs");
}

TEST(BatteriesTest, AMachineWithoutBatteryHasAReason) {
  std::string const command = "EXAMPLE_BATTERIES=/nowhere " ZEP_LIST_PROVIDER " " ZEP_BATTERIES_PLUGIN;
  EXPECT_THAT(OutputOf(command), testing::HasSubstr("Reason = the kernel shows no battery\n"));
}

// ---- The programs ----

TEST(ReadmeExampleTest, PrintsTheMachineTypeAndModelOfTheSample) {
  TEnvironmentGuard const table("ZEP_SMBIOS_TABLE", SourcePath("tools/zep/sample/smbios.bin").c_str());
  EXPECT_EQ(OutputOf(ZEP_README_EXAMPLE), "1234AB7\n");
}

// The environment in which the documentation runs PrintReport.
std::string PrintedReport() {
  TEnvironmentGuard const table("ZEP_SMBIOS_TABLE", SourcePath("tools/zep/sample/smbios.bin").c_str()),
      name("ZEP_HOST_NAME", "db1");
  return OutputOf(ZEP_PRINT_REPORT "; echo $?");
}

TEST(PrintReportTest, PrintsTheIdentityAndTheMemoryOfTheSample) {
  EXPECT_THAT(PrintedReport(), testing::MatchesRegex("Host name: db1\n(.*\n)*OS: (.*\n)*Memory: 128 GiB\n0\n"));
}

TEST(ListProviderTest, EndsInTheStatusOfAPlugInThatDoesNotLoad) {
  EXPECT_EQ(OutputOf(ZEP_LIST_PROVIDER " /nowhere/libNone.nsp.so 2>&1; echo $?"), "kZEPStatusFileSystemError\n1\n");
}

// ---- The documentation ----

struct TBlock {
  std::string fLanguage, fText;
};

// The fenced blocks of a document, in their order.
std::vector<TBlock> BlocksOf(std::string const& document) {
  std::vector<TBlock> blocks;
  bool isInside = false;
  std::istringstream lines(SourceFile(document));
  for (std::string line; std::getline(lines, line);) {
    bool const isFence = line.rfind("```", 0) == 0;
    if (isFence && !isInside)
      blocks.push_back({line.substr(3), ""});
    else if (!isFence && isInside)
      blocks.back().fText += line + "\n";
    isInside = isInside != isFence;
  }
  return blocks;
}

std::string FirstBlockOf(std::string const& document, std::string const& language) {
  for (TBlock const& block : BlocksOf(document))
    if (block.fLanguage == language) return block.fText;
  return "";
}

std::vector<TBlock> BlocksOf(std::string const& document, std::string const& language) {
  std::vector<TBlock> blocks;
  for (TBlock const& block : BlocksOf(document))
    if (block.fLanguage == language) blocks.push_back(block);
  return blocks;
}

// Expects that the blocks from `first` to before `last` are in the source file, verbatim and in the same order.
void ExpectBlocksFrom(std::vector<TBlock> const& blocks, std::size_t first, std::size_t last, std::string const& sourceName) {
  std::string const source = SourceFile(sourceName);
  ASSERT_FALSE(source.empty()) << sourceName;
  ASSERT_LE(last, blocks.size());
  std::size_t position = 0;
  for (std::size_t at = first; at < last; ++at) {
    std::size_t const found = source.find(blocks[at].fText, position);
    ASSERT_NE(found, std::string::npos) << "not in " << sourceName << ":\n" << blocks[at].fText;
    position = found + blocks[at].fText.size();
  }
}

// Expects that the document's blocks of that language, so many, are in the source file, verbatim and in the same order.
void ExpectBlocksFrom(std::string const& document, std::string const& language, std::string const& sourceName,
                      std::size_t count) {
  std::vector<TBlock> const blocks = BlocksOf(document, language);
  EXPECT_EQ(blocks.size(), count);
  ExpectBlocksFrom(blocks, 0, blocks.size(), sourceName);
}

TEST(DocumentationTest, ReadmeShowsTheCodeOfTheExample) { ExpectBlocksFrom("README.md", "cpp", "examples/ReadmeExample.cpp", 1); }

TEST(DocumentationTest, WalkThroughShowsTheCodeOfTheExamples) {
  std::vector<TBlock> const blocks = BlocksOf("docs/writing-a-provider.md", "cpp");
  EXPECT_EQ(blocks.size(), 9u);
  ExpectBlocksFrom(blocks, 0, 6, "examples/Clock/Clock.cpp");
  ExpectBlocksFrom(blocks, 6, 9, "examples/Batteries/Batteries.cpp");
  ExpectBlocksFrom("docs/writing-a-provider.md", "cmake", "examples/Clock/CMakeLists.txt", 1);
  EXPECT_EQ(FirstBlockOf("docs/writing-a-provider.md", "cmake"), SourceFile("examples/Clock/CMakeLists.txt"));
}

TEST(DocumentationTest, PageForFrontEndsShowsTheCodeOfTheExampleAndWhatItPrintsFirst) {
  ExpectBlocksFrom("docs/writing-a-front-end.md", "cpp", "examples/PrintReport.cpp", 1);
  std::string const command =
      "$ ZEP_HOST_NAME=db1 ZEP_SMBIOS_TABLE=tools/zep/sample/smbios.bin build/release/examples/PrintReport\n";
  std::string const shown = FirstBlockOf("docs/writing-a-front-end.md", "console");
  ASSERT_THAT(shown, testing::StartsWith(command));
  EXPECT_THAT(PrintedReport(), testing::StartsWith(shown.substr(command.size())));
}

TEST(DocumentationTest, PageOnSchemasShowsTheCodeOfTheExample) {
  ExpectBlocksFrom("docs/schemas.md", "cpp", "examples/Disks/Disks.cpp", 1);
}

TEST(DocumentationTest, TourShowsTheCodeOfTheExampleAndWhatItPrints) {
  ExpectBlocksFrom("docs/tour.md", "cpp", "examples/Tour.cpp", 9);
  std::string const command = "$ ZEP_SMBIOS_TABLE=tools/zep/sample/smbios.bin build/release/examples/Tour\n";
  TTempDir const dir;  // for its log
  TEnvironmentGuard const table("ZEP_SMBIOS_TABLE", SourcePath("tools/zep/sample/smbios.bin").c_str());
  EXPECT_EQ(FirstBlockOf("docs/tour.md", "console"), command + OutputOf("cd " + dir.Path() + " && " ZEP_TOUR));
  EXPECT_NE(ReadFile(dir.Path("tour.log")).find(" the fan turns slowly\n"), std::string::npos);
}

// Clocks go on: the numbers after " = " differ.
std::string WithoutNumbers(std::string const& text) { return std::regex_replace(text, std::regex(" = \\d+"), " = N"); }

TEST(DocumentationTest, WalkThroughShowsWhatListProviderPrints) {
  std::string const command = "$ build/release/examples/ListProvider build/release/examples/libClock.nsp.so\n";
  std::string const shown = FirstBlockOf("docs/writing-a-provider.md", "console");
  EXPECT_EQ(WithoutNumbers(shown), command + WithoutNumbers(OutputOf(ZEP_LIST_PROVIDER " " ZEP_CLOCK_PLUGIN)));
}

}  // namespace
}  // namespace NQRVZEP20
