// SPDX-License-Identifier: Apache-2.0

// zep plugins, and the options that choose plug-ins.

#include "tests/tools/zep/Envelope.h"
#include "tests/tools/zep/Zep.h"

#include <gmock/gmock.h>
#include <sys/stat.h>

namespace NQRVZEP20::zep {
namespace {

using testing::HasSubstr;
using testing::Not;

class PluginsTest : public testing::Test {
protected:
  TRun Run(std::vector<std::string> const& arguments, std::string const& behaviour = "works") {
    TCall call = {arguments};
    call.fEnvironment = {{"ZEP_TEST_PROVIDER", behaviour}};
    return fZep.Run(call);
  }

  // The entry of that file in the document of zep plugins.
  static nlohmann::json EntryOf(nlohmann::json const& document, std::string const& fileName) {
    for (nlohmann::json const& entry : document["files"]) {
      std::string const file = entry["file"];
      if (file.substr(file.rfind('/') + 1) == fileName) return entry;
    }
    ADD_FAILURE() << fileName << " is missing in " << document.dump(2);
    return {};
  }

  TInstallation fZep;
};

TEST_F(PluginsTest, AWorkingPlugInIsListedWithItsTimeClassesAndInstances) {
  TRun const run = Run({"plugins", "--json", "--sample"});
  ASSERT_EQ(run.fStatus, 0) << run.fErrors;
  ExpectEnvelope(run.fOutput, 0, "zep plugins");
  nlohmann::json const entry = EntryOf(JsonOf(run), "libHost.nsp.so");
  EXPECT_EQ(entry["loaded"], true);
  EXPECT_TRUE(entry["rule"].is_null());
  nlohmann::json const provider = entry["plugIn"]["providers"][0];
  EXPECT_EQ(provider["namespace"], "root/zep/host");
  EXPECT_GT(provider["classes"], 5);
  EXPECT_GT(provider["instances"], 5);
  EXPECT_GT(provider["milliseconds"], 0.0);
  EXPECT_EQ(EntryOf(JsonOf(run), "libzepcore.so")["rule"], "name");

  TRun const text = Run({"plugins"});
  EXPECT_EQ(text.fStatus, 0) << text.fErrors;
  EXPECT_THAT(text.fOutput, HasSubstr("Plug-in directory: " + fZep.Path("lib") + "\n"));
  EXPECT_THAT(text.fOutput, HasSubstr("filled root/zep/host"));
  EXPECT_THAT(text.fOutput, HasSubstr("passed over"));
}

TEST_F(PluginsTest, EachFileThatIsPassedOverHasItsRule) {
  WriteFile(fZep.Path("lib/libText.nsp.so"), "text");
  ASSERT_EQ(::mkfifo(fZep.Path("lib/libFifo.nsp.so").c_str(), 0600), 0);
  fs::create_symlink("/nowhere", fZep.Path("lib/libLink.nsp.so"));
  fZep.Add("libX.so", TEST_PROVIDER);
  fZep.Add("libOld.nsp.so.bak", TEST_PROVIDER);
  TRun const run = Run({"plugins", "--json"});
  EXPECT_EQ(run.fStatus, 2);
  nlohmann::json const document = JsonOf(run);
  std::map<std::string, std::string> const rules = {{"libText.nsp.so", "format"},
                                                    {"libFifo.nsp.so", "kind"},
                                                    {"libLink.nsp.so", "missing"},
                                                    {"libX.so", "name"},
                                                    {"libOld.nsp.so.bak", "name"}};
  for (auto const& [file, rule] : rules) {
    EXPECT_EQ(EntryOf(document, file)["rule"], rule) << file;
    EXPECT_EQ(EntryOf(document, file)["loaded"], false) << file;
  }
  EXPECT_THAT(document["reason"], HasSubstr("libOld.nsp.so.bak: passed over: its name is not lib<NAME>.nsp.so"));
  EXPECT_THAT(document["reason"], Not(HasSubstr("libX.so"))) << "an ordinary library is not meant to be a plug-in";
  EXPECT_THAT(run.fErrors, HasSubstr("zep: libFifo.nsp.so: passed over: it is a FIFO (named pipe)\n"));
}

TEST_F(PluginsTest, AFileWithoutPermissionIsNamed) {
  fZep.Add("libShut.nsp.so", TEST_PROVIDER);
  ::chmod(fZep.Path("lib/libShut.nsp.so").c_str(), 0);
  TCall call = {{"plugins", "--json"}};
  call.fAsNobody = true;
  TRun run = fZep.Run(call);
  EXPECT_EQ(EntryOf(JsonOf(run), "libShut.nsp.so")["rule"], "permission") << run.fOutput;
}

TEST_F(PluginsTest, APlugInThatFailsIsListedWithTheReason) {
  fZep.Add("libTest.nsp.so", TEST_PROVIDER);
  TRun const silent = Run({"plugins", "--json"}, "is-silent");
  EXPECT_EQ(silent.fStatus, 2);
  EXPECT_EQ(EntryOf(JsonOf(silent), "libTest.nsp.so")["rule"], "registered-nothing");

  TRun const throws = Run({"plugins"}, "throws");
  EXPECT_EQ(throws.fStatus, 2);
  EXPECT_THAT(throws.fErrors,
              HasSubstr("zep: libTest.nsp.so: provider Test failed: kZEPStatusAccessDenied (fill, libTest.nsp.so)"));
}

TEST_F(PluginsTest, EveryUndefinedSymbolIsNamed) {
  std::vector<std::string> const symbols = {"AnotherThatIsMissing(int, char const*)", "SymbolThatIsMissing(int)",
                                            "gObjectThatIsMissing"};
  fZep.Add("libLacks.nsp.so", LACKS_SYMBOL);
  for (std::vector<std::string> const& arguments :
       {std::vector<std::string>{"plugins", "--json"}, {"plugins", "--json", "--in-process"}}) {
    TRun const run = Run(arguments);
    EXPECT_EQ(run.fStatus, 2);
    nlohmann::json const entry = EntryOf(JsonOf(run), "libLacks.nsp.so");
    EXPECT_EQ(entry["rule"], "undefined-symbol");
    EXPECT_THAT(entry["plugIn"]["undefinedSymbols"], testing::UnorderedElementsAreArray(symbols));
    for (std::string const& symbol : symbols) EXPECT_THAT(entry["reason"], HasSubstr(symbol));
  }
}

TEST_F(PluginsTest, APlugInForAnotherProcessorIsNamed) {
  std::string plugIn = ReadFile(TEST_PROVIDER);
  plugIn[18] = 0x77, plugIn[19] = 0x01;  // the type of processor in an ELF header
  WriteFile(fZep.Path("lib/libOther.nsp.so"), plugIn);
  for (std::vector<std::string> const& options : {std::vector<std::string>{}, {"--in-process"}}) {
    std::vector<std::string> arguments = {"plugins", "--json"};
    arguments.insert(arguments.end(), options.begin(), options.end());
    nlohmann::json const entry = EntryOf(JsonOf(Run(arguments)), "libOther.nsp.so");
    EXPECT_EQ(entry["rule"], "failed");
    EXPECT_EQ(entry["plugIn"]["stage"], "open");
    EXPECT_THAT(entry["reason"], testing::ContainsRegex("it is built for processor type [0-9]+, and this process for "));
  }
}

TEST_F(PluginsTest, OfTwoThatRegisterOneNameBothAreNamed) {
  fZep.Add("libA.nsp.so", TEST_PROVIDER);
  fZep.Add("libB.nsp.so", TEST_PROVIDER);
  TRun const run = Run({"plugins"});
  EXPECT_EQ(run.fStatus, 2);
  EXPECT_EQ(EntryOf(JsonOf(Run({"plugins", "--json"})), "libB.nsp.so")["rule"], "name-taken");
  EXPECT_THAT(run.fErrors, HasSubstr("zep: libB.nsp.so: provider Test failed: the name Test is already registered by "
                                     "libA.nsp.so"));
}

TEST_F(PluginsTest, AMachineWithoutPlugInsHasNothing) {
  fZep.Remove("libHost.nsp.so");
  TRun const run = Run({"plugins", "--json"});
  EXPECT_EQ(run.fStatus, 1);
  EXPECT_EQ(JsonOf(run)["reason"], "no plug-in works in " + fZep.Path("lib"));
}

TEST_F(PluginsTest, APlugInFromElsewhereIsTriedByEveryCommandThatLoadsPlugIns) {
  std::string const file = fZep.Path("libTest.nsp.so");
  fs::copy(TEST_PROVIDER, file);
  TRun const report = Run({"report", "--json", "--sample", "--plugin", file}, "odd");
  EXPECT_THAT(report.fOutput, HasSubstr("root/test:X_Odd")) << report.fErrors;
  TRun const show = Run({"show", "--plugin", file, "X_Odd"}, "odd");
  EXPECT_EQ(show.fStatus, 0) << show.fErrors;
  TRun const classes = Run({"classes", "--plugin", file, "--plugin", file}, "odd");
  EXPECT_THAT(classes.fOutput, HasSubstr("X_Odd")) << classes.fErrors;
  TRun const plugins = Run({"plugins", "--json", "--plugin", file});
  EXPECT_EQ(EntryOf(JsonOf(plugins), "libTest.nsp.so")["loaded"], true);
  TRun const inProcess = Run({"plugins", "--json", "--in-process", "--plugin", file});
  EXPECT_EQ(EntryOf(JsonOf(inProcess), "libTest.nsp.so")["loaded"], true);
}

TEST_F(PluginsTest, APlugInThatIsTriedTakesThePlaceOfTheInstalledOne) {
  fZep.Add("libTest.nsp.so", TEST_PROVIDER);
  std::string const file = fZep.Path("libTest.nsp.so");
  fs::copy(TEST_PROVIDER, file);
  TRun const run = Run({"plugins", "--json", "--plugin", file});
  EXPECT_EQ(run.fStatus, 0) << run.fErrors;
  nlohmann::json const document = JsonOf(run);
  EXPECT_EQ(document["files"][0]["file"], file);
  bool isReplaced = false;
  for (nlohmann::json const& entry : document["files"]) isReplaced |= entry["rule"] == "replaced";
  EXPECT_TRUE(isReplaced);
}

TEST_F(PluginsTest, OfTwoTriedPlugInsWithOneNameTheFirstIsLoadedAndBothAreNamed) {
  std::vector<std::string> files;
  for (char const* directory : {"a", "b"}) {
    fs::create_directory(fZep.Path(directory));
    files.push_back(fZep.Path(std::string(directory) + "/libTest.nsp.so"));
    fs::copy(TEST_PROVIDER, files.back());
  }
  TRun const run = Run({"plugins", "--json", "--plugin", files[0], "--plugin", files[1]});
  EXPECT_EQ(run.fStatus, 2);
  EXPECT_EQ(JsonOf(run)["files"][0]["loaded"], true);
  EXPECT_EQ(JsonOf(run)["files"][1]["rule"], "replaced");
  EXPECT_EQ(run.fErrors, "zep: " + files[1] + ": passed over: a plug-in of the same name is tried before it: " + files[0] + "\n");

  TRun const twice = Run({"plugins", "--json", "--plugin", files[0], "--plugin", files[0]});
  EXPECT_EQ(twice.fStatus, 0) << twice.fErrors;
  EXPECT_EQ(JsonOf(twice)["files"][0]["file"], files[0]);
  EXPECT_NE(JsonOf(twice)["files"][1]["file"], files[0]);
}

TEST_F(PluginsTest, ATriedPlugInThatIsMissingCostsItsOwnRow) {
  TRun const run = Run({"report", "--sample", "--plugin", "/nowhere/libGone.nsp.so"});
  EXPECT_EQ(run.fStatus, 2);
  EXPECT_THAT(run.fOutput, HasSubstr("Server Q100"));
  EXPECT_THAT(run.fOutput, HasSubstr("Gone"));
}

TEST_F(PluginsTest, RootPassesOverAPlugInThatOthersMayWrite) {
  NEEDS(::geteuid() == 0, "root");
  fZep.Add("libTest.nsp.so", TEST_PROVIDER);
  ::chmod(fZep.Path("lib/libTest.nsp.so").c_str(), 0757);
  TRun const run = Run({"report", "--sample"});
  EXPECT_EQ(run.fStatus, 2);
  EXPECT_THAT(run.fErrors + run.fOutput, HasSubstr("--allow-writable"));
  EXPECT_EQ(EntryOf(JsonOf(Run({"plugins", "--json"})), "libTest.nsp.so")["rule"], "writable");
  EXPECT_EQ(Run({"report", "--sample", "--allow-writable"}).fStatus, 0);
}

TEST_F(PluginsTest, RootPassesOverPlugInsBelowADirectoryThatOthersMayWrite) {
  NEEDS(::geteuid() == 0, "root");
  fZep.Add("libTest.nsp.so", TEST_PROVIDER);
  for (std::string const& directory : {fZep.Path("lib"), fs::path(fZep.Path("lib")).parent_path().string()}) {
    SCOPED_TRACE(directory);
    fs::perms const before = fs::status(directory).permissions();
    fs::permissions(directory, fs::perms::others_write, fs::perm_options::add);
    TRun const run = Run({"plugins", "--json"});
    EXPECT_EQ(run.fStatus, 1);
    for (char const* file : {"libTest.nsp.so", "libHost.nsp.so"}) {
      EXPECT_EQ(EntryOf(JsonOf(run), file)["rule"], "writable");
      EXPECT_EQ(EntryOf(JsonOf(run), file)["reason"],
                "it would run as root, but every user may write " + directory + "; --allow-writable loads it nevertheless");
    }
    EXPECT_EQ(Run({"report", "--sample"}).fStatus, 1);
    EXPECT_EQ(Run({"report", "--sample", "--allow-writable"}).fStatus, 0);
    EXPECT_EQ(EntryOf(JsonOf(Run({"plugins", "--json", "--allow-writable"})), "libTest.nsp.so")["loaded"], true);
    fs::permissions(directory, before);
  }
}

}  // namespace
}  // namespace NQRVZEP20::zep
