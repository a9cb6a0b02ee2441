// SPDX-License-Identifier: Apache-2.0
#include "TOSSpecific.h"

#include "TLogger.h"
#include "tests/LogOf.h"
#include "tests/os/Programs.h"
#include "tests/os/Unprivileged.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

namespace NQRVZEP20 {
namespace {

namespace fs = std::filesystem;
using testing::ElementsAre;
using testing::IsEmpty;
using testing::UnorderedElementsAre;

std::string const kLibrary = BuildPath("lib/libzepcore.so");
std::string const kPlugins = BuildPath("tests/plugins/");
std::string const kProbe = BuildPath("tests/programs/PluginProbe");

std::vector<std::string> LinesOf(std::string const& text) {
  std::vector<std::string> lines;
  std::istringstream stream(text);
  for (std::string line; std::getline(stream, line);) lines.push_back(line);
  return lines;
}

TEST(TOSSpecificPluginsTest, TheStringsAreFixed) {
  EXPECT_EQ(TOSSpecific::kDynamicModuleExtension, ".so");
  EXPECT_EQ(TOSSpecific::kZEPPluginExtension, "pi");
  EXPECT_EQ(TOSSpecific::kPluginExtension, ".pi.so");
  EXPECT_EQ(TOSSpecific::kSpecificationExtension, ".properties.xml");
  EXPECT_EQ(TOSSpecific::kRegistrationExtension, ".registration.xml");
  EXPECT_EQ(TOSSpecific::kFileSeparator, "/");
  EXPECT_EQ(TOSSpecific::libx86IntrAddrFile, "/tmp/intr_address.tmp");
  EXPECT_EQ(kNSPExtension, ".nsp.so");
}

// ---- Collection plug-ins below a root ----

class FindPluginsTest : public testing::Test {
protected:
  // Makes an empty file, with the directory that holds it, and returns its path.
  std::string Make(std::string const& name) {
    fs::create_directories(fs::path(fDir.Path(name)).parent_path());
    WriteFile(fDir.Path(name), "");
    return fDir.Path(name);
  }

  TTempDir fDir;
};

TEST_F(FindPluginsTest, LooksOneLevelBelowTheRootOnly) {
  Make("libA.pi.so");
  std::string const plugin = Make("B/libB.pi.so");
  Make("B/deeper/libC.pi.so");
  EXPECT_THAT(TOSSpecific::FindPlugins(fDir.Path()), ElementsAre(plugin));
}

TEST_F(FindPluginsTest, SortsByBytes) {
  std::string const z = Make("Z/libZ.pi.so"), a = Make("A/libA.pi.so"), lower = Make("a/liba.pi.so"),
                    high = Make("\xc3\xa4/lib.pi.so"), second = Make("A/libB.pi.so"), space = Make("A b/lib.pi.so");
  EXPECT_THAT(TOSSpecific::FindPlugins(fDir.Path()), ElementsAre(space, a, second, z, lower, high));
}

TEST_F(FindPluginsTest, TheEndingMayBeAnywhereInTheName) {
  std::string const backup = Make("A/x.pi.so.bak"), bare = Make("A/.pi.so"), twice = Make("A/y.pi.so.pi.so");
  for (char const* name :
       {"A/libA.nsp.so", "A/libA.pi.s", "A/libApi.so", "A/libA.pi-so", "A/libA.PI.so", "A/libA.pi.properties.xml"})
    Make(name);
  EXPECT_THAT(TOSSpecific::FindPlugins(fDir.Path()), ElementsAre(bare, backup, twice));
}

TEST_F(FindPluginsTest, AnEntryNeedNotBeAFile) {
  fs::create_directories(fDir.Path("A/dir.pi.so"));
  fs::create_symlink("nowhere", fDir.Path("A/link.pi.so"));
  EXPECT_THAT(TOSSpecific::FindPlugins(fDir.Path()), ElementsAre(fDir.Path("A/dir.pi.so"), fDir.Path("A/link.pi.so")));
}

TEST_F(FindPluginsTest, FollowsALinkToADirectoryAndPassesOverADeadOne) {
  TTempDir const elsewhere;
  WriteFile(elsewhere.Path("libA.pi.so"), "");
  fs::create_directory_symlink(elsewhere.Path(), fDir.Path("link"));
  fs::create_symlink("nowhere", fDir.Path("dead"));
  EXPECT_THAT(TOSSpecific::FindPlugins(fDir.Path()), ElementsAre(fDir.Path("link/libA.pi.so")));
}

TEST_F(FindPluginsTest, FindsADirectoryWhoseNameBeginsWithADot) {
  std::string const hidden = Make(".hidden/libA.pi.so"), dots = Make(".../libA.pi.so");
  EXPECT_THAT(TOSSpecific::FindPlugins(fDir.Path()), ElementsAre(dots, hidden));
}

TEST_F(FindPluginsTest, FindsTheRequestedKind) {
  std::string const pi = Make("A/libA.pi.so"), cmpi = Make("A/libA.cmpi.so"), nsp = Make("A/libA.nsp.so");
  EXPECT_THAT(TOSSpecific::FindPlugins(fDir.Path(), "pi"), ElementsAre(pi));
  EXPECT_THAT(TOSSpecific::FindPlugins(fDir.Path(), "cmpi"), ElementsAre(cmpi));
  EXPECT_THAT(TOSSpecific::FindPlugins(fDir.Path(), "nsp"), ElementsAre(nsp));
  EXPECT_THAT(TOSSpecific::FindPlugins(fDir.Path(), "nsc"), IsEmpty());
}

TEST_F(FindPluginsTest, JoinsTheUnchangedRootWithASeparator) {
  Make("A/libA.pi.so");
  EXPECT_THAT(TOSSpecific::FindPlugins(fDir.Path() + "/"), ElementsAre(fDir.Path() + "//A/libA.pi.so"));
}

TEST_F(FindPluginsTest, AnEmptyRootHoldsNone) { EXPECT_THAT(TOSSpecific::FindPlugins(fDir.Path()), IsEmpty()); }

TEST_F(FindPluginsTest, ARootThatCannotBeOpenedIsAFileSystemError) {
  std::string const plain = Make("plain");
  for (std::string const& root : {fDir.Path("missing"), plain, std::string()}) {
    SCOPED_TRACE(root);
    EXPECT_STATUS(TOSSpecific::FindPlugins(root), kZEPStatusFileSystemError);
  }
}

TEST_F(FindPluginsTest, ASubdirectoryThatCannotBeOpenedIsAFileSystemError) {
  fs::permissions(fDir.Path(), fs::perms(0755));
  Make("A/libA.pi.so");
  Make("B/libB.pi.so");
  auto const find = [this] { TOSSpecific::FindPlugins(fDir.Path()); };
  EXPECT_EQ(ThrownWhenUnprivileged(find), kZEPStatusOK);
  fs::permissions(fDir.Path("A"), fs::perms(0700));
  EXPECT_EQ(ThrownWhenUnprivileged(find), kZEPStatusFileSystemError);
}

// ---- Companion documents ----

TEST(CompanionPathTest, IsBesideThePluginWithoutTheLibraryPrefix) {
  struct {
    char const *fPlugin, *fKind, *fStem;
  } const rows[] = {
      {"/opt/p/Disk/libDisk.pi.so", "pi", "/opt/p/Disk/Disk"},
      {"libDisk.pi.so", "pi", "Disk"},
      {"/opt/p/libFan.nsp.so", "nsp", "/opt/p/Fan"},
      {"/opt/p/libDisk.pi.so.bak", "pi", "/opt/p/Disk"},
      {"/opt/p/libDisk.pi.so/libDisk.pi.so", "pi", "/opt/p/Disk"},      // up to the first ending
      {"/usr/lib/p/Disk/libDisk.pi.so", "pi", "/usr//p/Disk/libDisk"},  // the first "lib", of a directory here
      {"/opt/library/Disk.pi.so", "pi", "/opt/rary/Disk"},
      {"/opt/p/libDisk.cmpi.so", "cmpi", "/opt/p/libDisk"},  // this kind keeps it
      {"/opt/p/Disk.cmpi.so", "cmpi", "/opt/p/Disk"},
      {"/opt/p/libDisk.CMPI.so", "CMPI", "/opt/p/Disk"},
      {"li.pi.so/blib.pi.so", "pi", nullptr},  // "lib" after the part that is kept
      {"xx.pi.so/lib", "pi", nullptr},
      {"lib.pi.so", "pi", ""},
  };
  for (auto const& row : rows) {
    SCOPED_TRACE(row.fPlugin);
    if (row.fStem) {
      EXPECT_EQ(TOSSpecific::BuildSpecificationPath(row.fPlugin, row.fKind), std::string(row.fStem) + ".properties.xml");
      EXPECT_EQ(TOSSpecific::BuildRegistrationPath(row.fPlugin, row.fKind), std::string(row.fStem) + ".registration.xml");
    } else {
      EXPECT_THROW(TOSSpecific::BuildSpecificationPath(row.fPlugin, row.fKind), std::out_of_range);
      EXPECT_THROW(TOSSpecific::BuildRegistrationPath(row.fPlugin, row.fKind), std::out_of_range);
    }
  }
}

TEST(CompanionPathTest, TheKindIsCollectionPluginUnlessGiven) {
  EXPECT_EQ(TOSSpecific::BuildSpecificationPath("/opt/p/Disk/libDisk.pi.so"), "/opt/p/Disk/Disk.properties.xml");
  EXPECT_STATUS(TOSSpecific::BuildSpecificationPath("/opt/p/Disk/libDisk.nsp.so"), kZEPStatusFail);
}

TEST(CompanionPathTest, WithoutTheEndingOrWithoutTheLibraryPrefixItFails) {
  struct {
    char const *fPlugin, *fKind;
  } const rows[] = {
      {"/opt/p/libDisk.nsp.so", "pi"},  {"/opt/p/libDisk.pi", "pi"}, {"/opt/p/libDiskpi.so", "pi"},  {"", "pi"},
      {"/opt/p/libDisk.cmpi.so", "pi"}, {"/opt/p/Disk.pi.so", "pi"}, {"/opt/p/LIBDisk.pi.so", "pi"}, {"libDisk.pi.so", "cmpi"},
  };
  for (auto const& row : rows) {
    SCOPED_TRACE(row.fPlugin);
    EXPECT_STATUS(TOSSpecific::BuildSpecificationPath(row.fPlugin, row.fKind), kZEPStatusFail);
    EXPECT_STATUS(TOSSpecific::BuildRegistrationPath(row.fPlugin, row.fKind), kZEPStatusFail);
  }
}

// ---- The root path and its files: a copy of the core library in a directory of the test's own, used by a program ----

class RootPathTest : public testing::Test {
protected:
  RootPathTest() { fs::copy_file(kLibrary, fDir.Path("libzepcore.so")); }

  // Copies a plug-in of the test tree into the root path.
  void Install(std::string const& file) { fs::copy_file(kPlugins + file, fDir.Path(file)); }

  // Returns the output of the program, which uses the core library in that directory.
  static std::vector<std::string> Probe(std::string const& directory, std::string const& arguments) {
    TProgramRun const run = RunProgram("LD_LIBRARY_PATH='" + directory + "' " + kProbe + " " + arguments);
    EXPECT_EQ(run.fExitCode, 0);
    return LinesOf(run.fOutput);
  }
  std::vector<std::string> Probe(std::string const& arguments) const { return Probe(fDir.Path(), arguments); }

  TTempDir fDir;
};

TEST_F(RootPathTest, IsTheDirectoryOfTheCoreLibrary) {
  EXPECT_EQ(TOSSpecific::GetZEPRootPath(), BuildPath("lib"));
  EXPECT_THAT(Probe("root"), ElementsAre(fDir.Path()));
}

TEST_F(RootPathTest, IsTheNameThatTheDynamicLinkerUses) {
  fs::create_directory(fDir.Path("link"));
  fs::create_symlink("../libzepcore.so", fDir.Path("link/libzepcore.so"));
  EXPECT_THAT(Probe(fDir.Path("link"), "root"), ElementsAre(fDir.Path("link")));
  EXPECT_EQ(RunProgram("cd " + fDir.Path() + " && LD_LIBRARY_PATH=. " + kProbe + " root").fOutput, ".\n");
  EXPECT_EQ(RunProgram("cd " + fDir.Path() + " && LD_LIBRARY_PATH=:/nowhere " + kProbe + " root").fOutput, ".\n");
}

TEST_F(RootPathTest, ALibraryNameOfUpTo511BytesIsTaken) {
  for (std::size_t length : {510u, 511u, 512u, 1000u}) {
    SCOPED_TRACE(length);
    std::string directory = fDir.Path();
    std::size_t const directoryLength = length - std::string("/libzepcore.so").size();
    while (directoryLength - directory.size() > 200) directory += "/" + std::string(99, 'd');
    directory += "/" + std::string(directoryLength - directory.size() - 1, 'e');
    fs::create_directories(directory);
    fs::copy_file(kLibrary, directory + "/libzepcore.so");
    EXPECT_THAT(Probe(directory, "root"), ElementsAre(length <= 511 ? directory : "threw kZEPStatusFileSystemError"));
    EXPECT_THAT(Probe(directory, "nsps"),
                length <= 511 ? std::vector<std::string>() : std::vector<std::string>{"threw kZEPStatusFileSystemError"});
  }
}

TEST_F(RootPathTest, HoldsProvidersAndConsumersByTheirBaseNames) {
  for (char const* name : {"libFan.nsp.so", "libFan.nsc.so", "libDisk.pi.so", "libHost.nsp.so", "readme.txt"})
    WriteFile(fDir.Path(name), "");
  EXPECT_THAT(Probe("services nsp"), UnorderedElementsAre("Fan", "Host"));
  EXPECT_THAT(Probe("nsps"), UnorderedElementsAre("Fan", "Host"));
  EXPECT_THAT(Probe("services nsc"), ElementsAre("Fan"));
  EXPECT_THAT(Probe("nscs"), ElementsAre("Fan"));
  EXPECT_THAT(Probe("services nsx"), IsEmpty());
}

TEST_F(RootPathTest, CutsThreeAndSevenCharactersOffAnyMatchingName) {
  struct {
    char const *fFile, *fBaseName;
  } const rows[] = {
      {"libFan.nsp.so", "Fan"},
      {"libFan.nsp.so.bak", "Fan.nsp"},
      {"Fan-x.nsp.so", "-x"},
      {"libFan.nspx.so", "Fan."},
      {"lib.nsp.so", ""},
      {"x.nsp", ""},
      {".nsp", ""},
      {"a.nspbcdefghij", "spbc"},
  };
  for (auto const& row : rows) {
    SCOPED_TRACE(row.fFile);
    WriteFile(fDir.Path(row.fFile), "");
    EXPECT_THAT(Probe("nsps"), ElementsAre(row.fBaseName));
    fs::remove(fDir.Path(row.fFile));
  }
}

TEST_F(RootPathTest, PassesOverDirectoriesAndDeadLinks) {
  fs::create_directory(fDir.Path("libDir.nsp.so"));
  fs::create_directory_symlink("libDir.nsp.so", fDir.Path("libDirLink.nsp.so"));
  fs::create_symlink("nowhere", fDir.Path("libDead.nsp.so"));
  fs::create_symlink("libzepcore.so", fDir.Path("libLink.nsp.so"));
  EXPECT_THAT(Probe("nsps"), ElementsAre("Link"));
}

TEST_F(RootPathTest, ARootThatCannotBeOpenedIsAFileSystemError) {
  // Found by a relative name, which leads nowhere from another working directory.
  TProgramRun const run = RunProgram("cd " + fDir.Path() + " && LD_LIBRARY_PATH=. " + kProbe + " nsps");
  EXPECT_EQ(run.fOutput, "");
  fs::create_directory(fDir.Path("zep-plug-ins"));
  fs::copy_file(kLibrary, fDir.Path("zep-plug-ins/libzepcore.so"));
  EXPECT_EQ(RunProgram("cd " + fDir.Path() + " && LD_LIBRARY_PATH=zep-plug-ins " + kProbe + " nsps-elsewhere").fOutput,
            "threw kZEPStatusFileSystemError\n");
}

TEST_F(RootPathTest, TheServicesComeInTheOrderOfTheDirectory) {
  for (char const* name : {"M", "Z", "A", "Q", "B", "Y", "C", "X"})
    WriteFile(fDir.Path(std::string("lib") + name + ".nsp.so"), "");
  std::vector<std::string> expected;
  for (auto const& entry : fs::directory_iterator(fDir.Path()))
    if (entry.path().filename() != "libzepcore.so") expected.push_back(entry.path().filename().string().substr(3, 1));
  EXPECT_EQ(Probe("nsps"), expected);
}

// ---- Without any platform library beside the core library ----

TEST_F(RootPathTest, WithoutTheIpmiClientNoControllerAnswers) {
  EXPECT_THAT(Probe("controller"), ElementsAre("[]", "not connected"));
}

TEST_F(RootPathTest, AnIpmiClientInstalledLaterIsLoadedThen) {
  if (kIsSanitized) GTEST_SKIP() << "the dlopen of a sanitizer searches the program's directories, which contain the real client";
  EXPECT_THAT(Probe("controller '' " ZEP_IPMI_STANDINS "/whole/libipmiClient.so"),
              ElementsAre("[]", "not connected", testing::_, "connected"));
}

// ---- Loading ----

TEST_F(RootPathTest, ALoadedProviderHasRegisteredItselfAndIsSeenByAll) {
  Install("libFan.nsp.so");
  EXPECT_THAT(Probe("load-nsp Fan"), ElementsAre("registered: Fan", "gFanProviderMark is seen by all"));
}

TEST_F(RootPathTest, LoadingAProviderTwiceRegistersItOnce) {
  Install("libFan.nsp.so");
  EXPECT_THAT(Probe("load-nsp Fan Fan"), ElementsAre("registered: Fan", "gFanProviderMark is seen by all", "registered: Fan",
                                                     "gFanProviderMark is seen by all"));
}

TEST_F(RootPathTest, AProviderThatCannotBeLoadedLogsTheLinkersReason) {
  Install("libUnresolved.nsp.so");
  WriteFile(fDir.Path("libText.nsp.so"), "this is a text, and not a library, however it is called; the linker says so");
  struct {
    char const *fBaseName, *fReason;
  } const rows[] = {
      {"Missing", "libMissing.nsp.so: cannot open shared object file: No such file or directory"},
      {"Text", "libText.nsp.so: invalid ELF header"},
      {"Unresolved", "libUnresolved.nsp.so: undefined symbol: ThereIsNoSuchFunction"},
  };
  for (auto const& row : rows) {
    SCOPED_TRACE(row.fBaseName);
    EXPECT_THAT(Probe(std::string("load-nsp ") + row.fBaseName),
                ElementsAre("threw kZEPStatusFileSystemError",
                            std::string("logged 0: Couldn't load NSP: ") + row.fBaseName + " (" + fDir.Path(row.fReason) + ")"));
  }
}

TEST_F(RootPathTest, ALoadedConsumerIsMadeForTheCallerWhoOwnsIt) {
  Install("libFan.nsc.so");
  EXPECT_THAT(Probe("load-nsc Fan"),
              ElementsAre("a consumer", "gFanConsumerMark is seen by all", "the Fan consumer ends", "the library is loaded"));
}

TEST_F(RootPathTest, AFactoryThatMakesNothingGivesNull) {
  Install("libNull.nsc.so");
  EXPECT_THAT(Probe("load-nsc Null"), ElementsAre("no consumer", "gFanConsumerMark is not seen", "the library is loaded"));
}

TEST_F(RootPathTest, AConsumerThatCannotBeLoadedLogsTheLinkersReason) {
  EXPECT_THAT(Probe("load-nsc Missing"),
              ElementsAre("threw kZEPStatusFileSystemError",
                          "logged 0: Couldn't load NSC: Missing (" +
                              fDir.Path("libMissing.nsc.so: cannot open shared object file: No such file or directory") + ")",
                          "the library is not loaded"));
}

TEST_F(RootPathTest, AConsumerLibraryWithoutItsFactoryIsNotFoundAndStaysLoaded) {
  Install("libUnprefixed.nsc.so");
  EXPECT_THAT(Probe("load-nsc Unprefixed"),
              ElementsAre("threw kZEPStatusNotFound",
                          "logged 0: Couldn't find 'CreateINamespaceConsumer' in " + fDir.Path("libUnprefixed.nsc.so"),
                          "the library is loaded"));
}

TEST_F(RootPathTest, TheFactorysNameBeginsWithTheRequestedBaseName) {
  fs::copy_file(kPlugins + "libFan.nsc.so", fDir.Path("libRenamed.nsc.so"));
  EXPECT_THAT(Probe("load-nsc Renamed"),
              ElementsAre("threw kZEPStatusNotFound",
                          "logged 0: Couldn't find 'CreateINamespaceConsumer' in " + fDir.Path("libRenamed.nsc.so"),
                          "the library is loaded"));
}

// The second library needs a function of the first: it is refused while that is missing, and loaded later.
TEST_F(RootPathTest, APluginIsResolvedAtOnceAndSeenByThoseLoadedLater) {
  std::string const user = kPlugins + "libDiskUser.pi.so";
  EXPECT_THAT(Probe("load-plugins " + user + " " + kPlugins + "libDisk.pi.so " + user),
              ElementsAre("threw kZEPStatusFileSystemError",
                          "logged 0: ERROR: Failed to load plugin.  Reason: " + user + ": undefined symbol: DiskCount", "loaded",
                          "loaded", "4"));
}

TEST(LoadPluginLibraryTest, LogsTheLinkersReasonAsAnError) {
  TTempDir const dir;
  OnNewThread([&dir] {
    TLogCapture const log;
    EXPECT_STATUS(TOSSpecific::LoadPluginLibrary(dir.Path("libA.pi.so")), kZEPStatusFileSystemError);
    EXPECT_THAT(log.Entries(), ElementsAre("[Error] ERROR: Failed to load plugin.  Reason: " + dir.Path("libA.pi.so") +
                                           ": cannot open shared object file: No such file or directory"));
  });
  TLogger().ClearLog();
}

TEST(LoadPluginLibraryTest, LinkersReasonTravelsWithTheFailure) {
  TTempDir const dir;
  auto const missing = [](std::string const& file) {
    return file + ": cannot open shared object file: No such file or directory";
  };
  std::string const root = TOSSpecific::GetZEPRootPath();
  struct {
    std::function<void()> fLoad;
    std::string fReason, fLine;
  } const rows[] = {
      {[&] { TOSSpecific::LoadPluginLibrary(dir.Path("libA.pi.so")); }, missing(dir.Path("libA.pi.so")),
       "[Error] ERROR: Failed to load plugin.  Reason: " + missing(dir.Path("libA.pi.so"))},
      {[] { TOSSpecific::LoadNSPLibrary("Nothing"); }, missing(root + "/libNothing.nsp.so"),
       "[Error] Couldn't load NSP: Nothing (" + missing(root + "/libNothing.nsp.so") + ")"},
      {[] { TOSSpecific::LoadNSCLibrary("Nothing"); }, missing(root + "/libNothing.nsc.so"),
       "[Error] Couldn't load NSC: Nothing (" + missing(root + "/libNothing.nsc.so") + ")"},
  };
  for (auto const& row : rows) {
    SCOPED_TRACE(row.fLine);
    EXPECT_THAT(LogOf([&] { EXPECT_EQ(ReasonOf(row.fLoad), row.fReason); }), ElementsAre(row.fLine));
  }
  TLogger().ClearLog();
}

}  // namespace
}  // namespace NQRVZEP20
