// SPDX-License-Identifier: Apache-2.0

// The examples do what the documentation says, and the documentation shows the code of the examples.

#include "TOSSpecific.h"
#include "TReasonReader.h"
#include "tests/Support.h"
#include "zepcore.h"

#include <gmock/gmock.h>

#include <fnmatch.h>

#include <cstdio>
#include <filesystem>
#include <functional>
#include <map>
#include <memory>
#include <regex>
#include <set>
#include <sstream>

namespace NQRVZEP20 {
namespace {

using namespace std::string_literals;

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

// The sample's SMBIOS table after `change` of each memory module.
std::string SampleWithModules(std::function<std::string(std::string const& module)> const& change) {
  std::string const table = SourceFile("tools/zep/sample/smbios.bin");
  constexpr char memoryModule = 17;
  std::string changed;
  for (std::size_t start = 0; start < table.size();) {
    std::size_t const strings = start + static_cast<std::uint8_t>(table[start + 1]), end = table.find("\0\0"s, strings) + 2;
    std::string const structure = table.substr(start, end - start);
    changed += structure[0] == memoryModule ? change(structure) : structure;
    start = end;
  }
  return changed;
}

// The answer of the example's rule about a machine with that SMBIOS table.
std::string AnswerOfOwnRule(std::string const& table) {
  TEnvironmentGuard const variable("ZEP_SMBIOS_TABLE", table.c_str());
  return OutputOf(ZEP_OWN_RULE);
}

TEST(OwnRuleTest, FindsTheProblemOrNothingOrTheReason) {
  TTempDir const dir;
  EXPECT_EQ(AnswerOfOwnRule(SourcePath("tools/zep/sample/smbios.bin")), "site-memory: fine\n");
  WriteFile(dir.Path("empty"), "");
  EXPECT_EQ(AnswerOfOwnRule(dir.Path("empty")), "site-memory: not-asked\n");
  WriteFile(dir.Path("none"), SampleWithModules([](std::string const&) { return std::string(); }));
  EXPECT_EQ(AnswerOfOwnRule(dir.Path("none")), "site-memory: not-asked\n") << "a table without modules";
  WriteFile(dir.Path("small"), SampleWithModules([](std::string module) { return module.replace(0x0C, 2, "\0\x04"s); }));
  EXPECT_EQ(AnswerOfOwnRule(dir.Path("small")), "warning: the memory of 8 GiB is smaller than 64 GiB\nsite-memory: wrong\n");
}

TEST(ListProviderTest, EndsInTheStatusOfAPlugInThatDoesNotLoad) {
  EXPECT_EQ(OutputOf(ZEP_LIST_PROVIDER " /nowhere/libNone.nsp.so 2>&1; echo $?"), "kZEPStatusFileSystemError\n1\n");
}

// ---- The documentation ----

// A fenced block. After its language, a block with a complete file has the name of that file under examples/.
struct TBlock {
  std::string fLanguage, fWord, fText;
};

// The fenced blocks of a document, in their order.
std::vector<TBlock> BlocksOf(std::string const& document) {
  std::vector<TBlock> blocks;
  bool isInside = false;
  std::istringstream lines(SourceFile(document));
  for (std::string line; std::getline(lines, line);) {
    bool const isFence = line.rfind("```", 0) == 0;
    if (isFence && !isInside) {
      blocks.emplace_back();
      std::istringstream(line.substr(3)) >> blocks.back().fLanguage >> blocks.back().fWord;
    } else if (!isFence && isInside) {
      blocks.back().fText += line + "\n";
    }
    isInside = isInside != isFence;
  }
  return blocks;
}

bool IsSource(TBlock const& block) { return block.fLanguage == "cpp" || block.fLanguage == "cmake" || block.fLanguage == "mof"; }

struct TShown {
  char const *fDocument, *fName, *fExample;
};

TShown const kShown[] = {{"README.md", "ReadmeExample.cpp", "ReadmeExample.cpp"},
                         {"docs/tour.md", "Tour.cpp", "Tour.cpp"},
                         {"docs/writing-a-provider.md", "disks.mof", "Disks/disks.mof"},
                         {"docs/writing-a-provider.md", "Clock/Clock.cpp", "Clock/Clock.cpp"},
                         {"docs/writing-a-provider.md", "Clock/CMakeLists.txt", "Clock/CMakeLists.txt"},
                         {"docs/writing-a-provider.md", "ListProvider.cpp", "ListProvider.cpp"},
                         {"docs/writing-a-provider.md", "Batteries/Batteries.cpp", "Batteries/Batteries.cpp"},
                         {"docs/writing-a-provider.md", "Batteries/CMakeLists.txt", "Batteries/CMakeLists.txt"},
                         {"docs/writing-a-front-end.md", "PrintReport.cpp", "PrintReport.cpp"},
                         {"docs/findings.md", "OwnRule.cpp", "OwnRule.cpp"},
                         {"docs/schemas.md", "Disks/Disks.cpp", "Disks/Disks.cpp"},
                         {"docs/schemas.md", "Disks/disks.mof", "Disks/disks.mof"},
                         {"docs/schemas.md", "Disks/CMakeLists.txt", "Disks/CMakeLists.txt"}};

std::vector<std::string> Pages() {
  std::vector<std::string> pages{"README.md"};
  for (auto const& entry : std::filesystem::directory_iterator(SourcePath("docs")))
    pages.push_back("docs/" + entry.path().filename().string());
  return pages;
}

TEST(DocumentationTest, EachExampleIsCompleteOnItsPage) {
  for (TShown const& shown : kShown) {
    SCOPED_TRACE(shown.fDocument + std::string(" shows ") + shown.fName);
    std::vector<std::string> texts;
    for (TBlock const& block : BlocksOf(shown.fDocument))
      if (IsSource(block) && block.fWord == shown.fName) texts.push_back(block.fText);
    EXPECT_THAT(texts, testing::ElementsAre(SourceFile(std::string("examples/") + shown.fExample)));
  }
}

TEST(DocumentationTest, EveryExampleIsOnAPage) {
  std::filesystem::path const examples = SourcePath("examples");
  std::set<std::string> files, shownFiles;
  for (auto const& entry : std::filesystem::recursive_directory_iterator(examples))
    if (entry.is_regular_file()) files.insert(entry.path().lexically_relative(examples));
  files.erase("CMakeLists.txt");  // of all examples, for the build of the tree
  for (TShown const& shown : kShown) shownFiles.insert(shown.fExample);
  EXPECT_EQ(files, shownFiles);
}

// The examples of which a page shows parts, in their order: the tour task by task.
std::map<std::string, std::string> const kInParts = {{"docs/tour.md", "examples/Tour.cpp"},
                                                     {"docs/findings.md", "examples/Batteries/Batteries.cpp"}};

TEST(DocumentationTest, EverySourceOnAPageIsFromAnExample) {
  std::size_t named = 0, parts = 0;
  for (auto const& document : Pages()) {
    std::size_t position = 0;
    for (TBlock const& block : BlocksOf(document)) {
      if (!IsSource(block)) continue;
      named += block.fWord.empty() ? 0 : 1;
      if (!block.fWord.empty()) continue;
      ++parts;
      ASSERT_EQ(kInParts.count(document), 1U) << block.fText;
      position = SourceFile(kInParts.at(document)).find(block.fText, position);
      ASSERT_NE(position, std::string::npos) << "not in the example, or not in this order:\n" << block.fText;
    }
  }
  EXPECT_EQ(named, std::size(kShown));
  EXPECT_EQ(parts, 11u);
}

// The output that a page shows below a command, which is the last one of its block. "..." stands for any text.
std::string ShownOutputOf(std::string const& document, std::string const& command) {
  std::string const line = "$ " + command + "\n";
  for (TBlock const& block : BlocksOf(document)) {
    std::size_t const at = block.fText.find(line);
    if (at != std::string::npos) return block.fText.substr(at + line.size());
  }
  ADD_FAILURE() << document << " does not show " << command;
  return "";
}

std::string PatternOf(std::string const& shown) {
  std::string const escaped = std::regex_replace(shown, std::regex(R"([\[\]*?\\])"), R"(\$&)");
  return std::regex_replace(escaped, std::regex(R"(\.\.\.)"), "*");
}

void ExpectShown(std::string const& output, std::string const& shown) {
  EXPECT_EQ(::fnmatch(PatternOf(shown).c_str(), output.c_str(), 0), 0) << "shown:\n" << shown << "printed:\n" << output;
}

TEST(DocumentationTest, PageForFrontEndsShowsWhatTheExamplePrints) {
  ExpectShown(PrintedReport(), ShownOutputOf("docs/writing-a-front-end.md",
                                             "ZEP_HOST_NAME=db1 ZEP_SMBIOS_TABLE=tools/zep/sample/smbios.bin "
                                             "build/release/examples/PrintReport"));
}

TEST(DocumentationTest, TourShowsWhatTheExamplePrints) {
  TTempDir const dir;  // for its log
  TEnvironmentGuard const table("ZEP_SMBIOS_TABLE", SourcePath("tools/zep/sample/smbios.bin").c_str());
  EXPECT_EQ(OutputOf("cd " + dir.Path() + " && " ZEP_TOUR),
            ShownOutputOf("docs/tour.md", "ZEP_SMBIOS_TABLE=tools/zep/sample/smbios.bin build/release/examples/Tour"));
  EXPECT_NE(ReadFile(dir.Path("tour.log")).find(" the fan turns slowly\n"), std::string::npos);
}

TEST(DocumentationTest, WalkThroughShowsWhatListProviderPrints) {
  ExpectShown(OutputOf(ZEP_LIST_PROVIDER " " ZEP_CLOCK_PLUGIN),
              ShownOutputOf("docs/writing-a-provider.md", "./list-provider Clock/build/libClock.nsp.so"));
}

}  // namespace
}  // namespace NQRVZEP20
