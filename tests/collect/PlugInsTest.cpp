// SPDX-License-Identifier: Apache-2.0
#include "collect/PlugIns.h"

#include "tests/Support.h"
#include "tests/collect/SamplePlugIns.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <cstdio>
#include <memory>

namespace NQRVZEP20 {
namespace {

namespace fs = std::filesystem;

TEST(PlugInsTest, PlugInsBesideTheLibraryAreLoadedAndFillTheirNamespaces) {
  auto const& plugIns = SamplePlugIns();
  auto const host = std::find_if(plugIns.begin(), plugIns.end(), [](TPlugIn const& plugIn) { return plugIn.fName == "Host"; });
  ASSERT_NE(host, plugIns.end());
  EXPECT_EQ(host->fFile, PlugInDirectory() + "/libHost.nsp.so");
  EXPECT_FALSE(host->HasFailed());
  ASSERT_EQ(host->fProviders.size(), 1u);
  EXPECT_EQ(host->fProviders[0].fView->GetName(), "root/zep/host");
  EXPECT_EQ(host->fProviders[0].fView->GetSampleLabel(), "SAMPLE");
}

TPlugIn PlugIn(std::string const& name, std::string const& error, std::vector<TProviderRun> const& providers) {
  return {name, "lib" + name + ".nsp.so", 0, error, providers};
}

TEST(PlugInsTest, AFailureNamesItsStageAndTheLastLogLine) {
  TPlugIn plugIn = PlugIn("A", "file too short", {{"A1", nullptr, 0, "kZEPStatusFail", "fill", "[Error] no disk"}});
  plugIn.fStage = "open";
  EXPECT_EQ(FailurePhraseOf(plugIn), "file too short (open, libA.nsp.so)");
  EXPECT_EQ(FailurePhraseOf(plugIn, plugIn.fProviders[0]), "kZEPStatusFail (fill, libA.nsp.so); last log line: [Error] no disk");
}

TEST(PlugInsTest, EachFailureIsNamed) {
  std::vector<TPlugIn> const plugIns = {PlugIn("A", "file too short", {}),
                                        PlugIn("B", "", {{"B1", nullptr, 0, "kZEPStatusFail"}, {"B2", nullptr, 0, ""}}),
                                        PlugIn("C", "", {})};
  EXPECT_EQ(FailuresOf(plugIns),
            (std::vector<std::string>{"A: file too short (libA.nsp.so)", "B1: kZEPStatusFail (libB.nsp.so)"}));
  EXPECT_TRUE(plugIns[0].HasFailed());
  EXPECT_TRUE(plugIns[1].HasFailed());
  EXPECT_FALSE(plugIns[2].HasFailed());
  EXPECT_TRUE(ViewsOf(plugIns).empty());
}

// A directory with libzepcore.so, a plug-in that is not a library, and one with the given behaviour.
class PlugInDirectoryTest : public testing::Test {
protected:
  PlugInDirectoryTest() {
    fs::copy(TEST_LIBZEPCORE, fDir.Path("libzepcore.so"));
    fs::copy(TEST_PROVIDER, fDir.Path("libTest.nsp.so"));
    WriteFile(fDir.Path("libBroken.nsp.so"), "this is not a library");
  }

  // A line for each plug-in and each provider.
  std::string List(std::string const& behaviour) const {
    std::string const command =
        "LD_LIBRARY_PATH=" + fDir.Path() + " ZEP_TEST_PROVIDER=" + behaviour + " " + LISTS_PLUG_INS + " 2>&1";
    std::unique_ptr<FILE, int (*)(FILE*)> const pipe(::popen(command.c_str(), "r"), ::pclose);
    std::string output;
    for (int c; (c = std::fgetc(pipe.get())) != EOF;) output += static_cast<char>(c);
    return output;
  }

  TTempDir const fDir;
};

TEST_F(PlugInDirectoryTest, APlugInThatFailsDoesNotStopTheOthers) {
  std::string const broken = "plug-in Broken: " + fDir.Path("libBroken.nsp.so") + ": file too short (open, libBroken.nsp.so)\n";
  struct TRow {
    char const *fBehaviour, *fListed;
  } const rows[] = {
      {"works", "plug-in Test: \nprovider Test: filled root/test (0)\n"},
      {"throws", "plug-in Test: \nprovider Test: kZEPStatusAccessDenied (fill, libTest.nsp.so)\n"},
      {"throws-a-number",
       "plug-in Test: \nprovider Test: it threw an object that is not a std::exception (fill, libTest.nsp.so)\n"},
      {"no-namespace", "plug-in Test: \nprovider Test: it has no namespace (fill, libTest.nsp.so)\n"},
      {"is-silent", "plug-in Test: \n"},
  };
  for (TRow const& row : rows) EXPECT_EQ(List(row.fBehaviour), broken + row.fListed) << row.fBehaviour;
}

}  // namespace
}  // namespace NQRVZEP20
