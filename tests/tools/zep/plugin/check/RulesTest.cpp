// SPDX-License-Identifier: Apache-2.0

// zep plugin check: each planted fault is found by its rule, with its place, and by no other rule.

#include "tools/zep/plugin/check/Rules.h"

#include "tests/DmtfSchema.h"
#include "tests/Machines.h"
#include "tests/tools/zep/Envelope.h"
#include "tests/tools/zep/Zep.h"

#include <gmock/gmock.h>

namespace NQRVZEP20::zep {
namespace {

using testing::HasSubstr;

using TNames = std::vector<std::string>;

constexpr char kMof[] =
    R"(Qualifier Abstract : boolean = false, Scope(class, association, indication), Flavor(EnableOverride, Restricted);
Qualifier Key : boolean = false, Scope(property, reference), Flavor(DisableOverride, ToSubclass);
[Abstract] class CIM_Element { [Key] string Id; };
class CIM_Thing : CIM_Element { uint16 State; };
)";

class CheckTest : public testing::Test {
protected:
  CheckTest() {
    fs::create_directory(fZep.Path("work"));
    WriteFile(fZep.Path("work/things.mof"), kMof);
  }

  // Copies the plug-in with the faults to that file in the working directory.
  std::string Faulty(std::string const& fileName, std::string const& source = FAULTY) {
    fs::copy(source, fZep.Path("work/" + fileName), fs::copy_options::overwrite_existing);
    return fileName;
  }

  TRun Check(std::string const& file, TNames const& options = {}, std::map<std::string, std::string> const& environment = {}) {
    TCall call = {{"plugin", "check", file}};
    call.fArguments.insert(call.fArguments.end(), options.begin(), options.end());
    call.fEnvironment = environment;
    call.fEnvironment.emplace("ZEP_DMTF_SCHEMA", "");
    call.fDirectory = fZep.Path("work");
    fs::remove(fZep.Path("work/second-time"));
    return fZep.Run(call);
  }

  nlohmann::json DocumentOf(std::string const& file, TNames options = {}) {
    options.push_back("--json");
    TRun const run = Check(file, options);
    ExpectEnvelope(run.fOutput, run.fStatus, "zep plugin check");
    return JsonOf(run);
  }

  static nlohmann::json RuleOf(nlohmann::json const& document, std::string const& id) {
    for (nlohmann::json const& rule : document["rules"])
      if (rule["id"] == id) return rule;
    ADD_FAILURE() << "no rule " << id << " in " << document.dump(2);
    return {};
  }

  static TNames FoundIn(nlohmann::json const& document) {
    TNames found;
    for (nlohmann::json const& rule : document["rules"])
      if (rule["status"] == "found") found.push_back(rule["id"]);
    return found;
  }

  struct TFault {
    std::string fName, fRule, fPlace, fText;
    TNames fOptions = {};
  };

  // The plug-in of that name has a finding of that rule, with the place and the text, and no other rule finds anything.
  void ExpectFound(TFault const& fault) {
    SCOPED_TRACE(fault.fName);
    nlohmann::json const document = DocumentOf(Faulty("lib" + fault.fName + ".nsp.so"), fault.fOptions);
    EXPECT_EQ(document["exitStatus"], 1);
    EXPECT_EQ(FoundIn(document), TNames{fault.fRule}) << document.dump(2);
    nlohmann::json const rule = RuleOf(document, fault.fRule);
    ASSERT_FALSE(rule["findings"].empty());
    EXPECT_THAT(rule["findings"][0]["place"], HasSubstr(fault.fPlace));
    EXPECT_THAT(rule["findings"][0]["text"], HasSubstr(fault.fText));
  }

  static TNames PlugInsOfTheBuild() {
    TNames files;
    for (auto const& entry : fs::directory_iterator(TEST_LIB_DIR))
      if (std::string const file = entry.path().string(); testing::Value(file, testing::EndsWith(".nsp.so")))
        files.push_back(file);
    EXPECT_FALSE(files.empty());
    return files;
  }

  // The plug-in describes the recorded machine, which does not change meanwhile.
  nlohmann::json ExpectPassed(std::string const& file, TRecordedMachine const& machine, TNames options = {}) {
    SCOPED_TRACE(file);
    fs::copy(SourcePath("examples/Disks/disks.mof"), fZep.Path("lib/disks.mof"), fs::copy_options::overwrite_existing);
    options.push_back("--json");
    TRun const run = Check(file, options, {{"ZEP_ROOT", machine.Root()}, {"ZEP_SMBIOS_TABLE", SamplePath()}});
    EXPECT_EQ(run.fStatus, 0) << run.fOutput << run.fErrors;
    nlohmann::json const document = JsonOf(run);
    EXPECT_FALSE(document["figures"]["providers"][0]["classes"].empty());
    return document;
  }

  TInstallation fZep;
};

TEST_F(CheckTest, AFaultOfTheLoadOrTheFillIsFoundByItsRule) {
  for (TFault const& fault : std::vector<TFault>{
           {"LoadThrows", "static-construction", "static construction", "no disk today"},
           {"RegistersNothing", "registration", "libRegistersNothing.nsp.so", "it registers no provider"},
           {"RegistersTwice", "registration", "provider RegistersTwice", "registers this name twice"},
           {"RegistersHost", "registration", "provider Host", "it registers the name of another plug-in"},
           {"RegistersAnother", "registration", "provider Another", "no provider has the name of the plug-in, RegistersAnother"},
           {"Throws", "fill", "provider Throws", "no disk"},
           {"Crashes", "fill", "provider Crashes", "SIGSEGV"},
           {"Exits", "fill", "provider Exits", "it exited with status 3"},
           {"Hangs", "time-and-memory", "provider Hangs, fill", "time limit of 1 s", {"--plugin-timeout", "1"}},
       })
    ExpectFound(fault);
  if (kIsSanitized) return;  // which needs more memory than any limit allows
  ExpectFound(
      {"FillsMemory", "time-and-memory", "provider FillsMemory, fill", "the memory limit is 64 MiB", {"--plugin-memory", "64"}});
}

TEST_F(CheckTest, AFillThatDiffersIsFound) {
  for (TFault const& fault : std::vector<TFault>{
           {"KeyDiffers", "fill-differs", "root/faulty:X_Thing.Id=", "it is missing the second time"},
           {"TimeIsKey", "fill-differs", "root/faulty:X_Thing.Id=", "it is missing the second time"},
           {"ClassDiffers", "fill-differs", "class X_Of", "it is missing the second time"},
           {"TypeDiffers", "fill-differs", "X_Thing.Text", "its type is string, and uint16 the second time"},
           {"FailsLater", "fill-differs", "provider FailsLater", "it failed the second time: no more"},
       })
    ExpectFound(fault);
}

TEST_F(CheckTest, ATraceThatIsLeftIsFoundByItsRule) {
  for (TFault const& fault : std::vector<TFault>{
           {"LeavesDescriptor", "left-behind", "(/dev/null)", "it is still open after the fill"},
           {"LeavesProcess", "left-behind", "(zep)", "it is left after the fill"},
           {"LeavesOrphan", "left-behind", "(zep)", "it is left after the fill"},
           {"Prints", "output", "standard output or standard error", "it prints \"found 3 disks\" and more lines"},
       })
    ExpectFound(fault);
}

TEST_F(CheckTest, AFaultOfTheContentsIsFoundByItsRule) {
  TNames const withSchema = {"--mof", "things.mof"};
  for (TFault const& fault : std::vector<TFault>{
           {"HasNoKey", "keys", "X_Plain", "instances without any key value, whose path is that of the class: 1"},
           {"HasNullKey", "keys", "root/faulty:X_Thing.Id=\"1\".Other", "the key is NULL"},
           {"HasBytes", "text", "root/faulty:X_Thing.Id=\"1\".Text", "\"a\\xff\" has bytes"},
           {"HasZero", "text", "root/faulty:X_Thing.Id=\"a\\x00b\".Id", "\"a\\x00b\" has bytes"},
           {"HasBytesInAList", "text", "root/faulty:X_Thing.Id=\"1\".Text[1]", "\"\\xff\" has bytes"},
           {"HasBytesInAQualifier", "text", "X_Thing, qualifier Description", "\"a\\xff\" has bytes"},
           {"HasBytesInADefault", "text", "X_Thing.Text, default value", "\"a\\xff\" has bytes"},
           {"HasBytesInAStatic", "text", "X_Thing.Text, static value", "\"a\\xff\" has bytes"},
           {"HasBytesInAMethod", "text", "X_Thing.Stop(), parameter Reason, qualifier Description", "\"a\\xff\" has bytes"},
           {"HasUnnamedNamespace", "text", "namespace", "the name is empty"},
           {"HasBytesInNamespace", "text", "namespace", "the name \"root/\\xff\" has bytes"},
           {"HasBytes\xff", "text", "provider", "the name \"HasBytes\\xff\" has bytes"},
           {"IsInfinite", "text", "root/faulty:X_Thing.Id=\"1\".Text", "inf is not a number in JSON"},
           {"HasWrongType", "schema", "CIM_Thing.State", "its type is string, in the schema uint16", withSchema},
           {"HasWrongKey", "schema", "CIM_Thing.State", "it is a key, but not in the schema", withSchema},
           {"HasWrongSuperClass", "schema", "CIM_Thing", "in the schema, CIM_Other is not a superclass of it", withSchema},
           {"IsAbstract", "schema", "CIM_Element", "it is abstract in the schema, but has instances", withSchema},
       })
    ExpectFound(fault);
}

TEST_F(CheckTest, AFileThatHostsCannotFindIsFound) {
  nlohmann::json const document = DocumentOf(Faulty("disks.so"));
  EXPECT_EQ(FoundIn(document), TNames{"name"}) << document.dump(2);
  EXPECT_THAT(RuleOf(document, "name")["findings"][0]["place"], HasSubstr("/work/disks.so"));
  EXPECT_EQ(document["reason"], "found: name (1)");
}

TEST_F(CheckTest, UndefinedSymbolsAreFoundAndTheOtherRulesAreNotChecked) {
  nlohmann::json const document = DocumentOf(Faulty("libLacks.nsp.so", LACKS_SYMBOL));
  EXPECT_EQ(FoundIn(document), (TNames{"undefined-symbols", "exports"})) << document.dump(2);
  TNames symbols;
  nlohmann::json const rule = RuleOf(document, "undefined-symbols");
  for (nlohmann::json const& finding : rule["findings"]) symbols.push_back(finding["place"]);
  EXPECT_THAT(symbols, testing::UnorderedElementsAre("AnotherThatIsMissing(int, char const*)", "SymbolThatIsMissing(int)",
                                                     "gObjectThatIsMissing"));
  EXPECT_THAT(RuleOf(document, "exports")["findings"][0]["text"],
              HasSubstr("may replace those of other plug-ins: 1, such as UseIt"));
  for (char const* id : {"static-construction", "registration", "fill", "fill-differs", "keys", "text", "schema"})
    EXPECT_EQ(RuleOf(document, id)["whyNotChecked"], "the plug-in could not be loaded") << id;
}

TEST_F(CheckTest, APlugInThatExportsItsFunctionsIsFound) {
  nlohmann::json const document = DocumentOf(Faulty("libExports.nsp.so", FAULTY_EXPORTS));
  EXPECT_EQ(FoundIn(document), TNames{"exports"}) << document.dump(2);
  nlohmann::json const finding = RuleOf(document, "exports")["findings"][0];
  EXPECT_EQ(finding["place"], "libExports.nsp.so");
  EXPECT_THAT(finding["text"], testing::ContainsRegex("may replace those of other plug-ins: [0-9][0-9]+, such as "));
  EXPECT_THAT(finding["remedy"], HasSubstr("zep_add_provider"));
}

TEST_F(CheckTest, AFileThatIsNoLibraryIsFound) {
  WriteFile(fZep.Path("work/libText.nsp.so"), "text");
  nlohmann::json const document = DocumentOf("libText.nsp.so");
  EXPECT_EQ(FoundIn(document), TNames{"load"}) << document.dump(2);
  EXPECT_EQ(RuleOf(document, "load")["findings"][0]["text"], "it is not an ELF file");
  EXPECT_EQ(RuleOf(document, "exports")["status"], "not-checked");

  fs::create_directory(fZep.Path("work/libDirectory.nsp.so"));
  nlohmann::json const directory = DocumentOf("libDirectory.nsp.so");
  EXPECT_EQ(FoundIn(directory), TNames{"name"}) << directory.dump(2);
  EXPECT_EQ(RuleOf(directory, "fill")["whyNotChecked"], "the file is not loaded");
}

TEST_F(CheckTest, TwoInstancesWithOnePathAreFound) {
  nlohmann::json const document = DocumentOf(Faulty("libHasOnePath.nsp.so"));
  EXPECT_EQ(FoundIn(document), (TNames{"keys", "text"})) << document.dump(2);
  nlohmann::json const finding = RuleOf(document, "keys")["findings"][0];
  EXPECT_EQ(finding["place"], "root/faulty:X_Thing.Id=\"1\",Size=\"0.123457\"");
  EXPECT_EQ(finding["text"], "instances with this path: 2");
  EXPECT_EQ(RuleOf(document, "text")["found"], 2);
}

TEST_F(CheckTest, AProviderWithoutANameIsFound) {
  nlohmann::json const document = DocumentOf(Faulty("libRegistersUnnamed.nsp.so"));
  EXPECT_EQ(FoundIn(document), (TNames{"registration", "text"})) << document.dump(2);
  EXPECT_EQ(RuleOf(document, "text")["findings"][0]["text"], "the name is empty");
}

TEST_F(CheckTest, AKeyOfTheSchemaThatIsMissingIsFound) {
  nlohmann::json const document = DocumentOf(Faulty("libHasWrongKey.nsp.so"), {"--mof", "things.mof"});
  EXPECT_EQ(RuleOf(document, "schema")["findings"][1]["place"], "CIM_Thing.Id");
  EXPECT_EQ(RuleOf(document, "schema")["findings"][1]["text"], "this key of the schema is missing");
}

TEST_F(CheckTest, InformationIsNotAFinding) {
  nlohmann::json const changes = DocumentOf(Faulty("libValueDiffers.nsp.so"));
  EXPECT_EQ(changes["exitStatus"], 0) << changes.dump(2);
  EXPECT_EQ(RuleOf(changes, "fill-differs")["notes"][0]["place"], "X_Thing.Text");

  nlohmann::json const isLong = DocumentOf(Faulty("libIsLong.nsp.so"));
  EXPECT_EQ(isLong["exitStatus"], 0) << isLong.dump(2);
  EXPECT_EQ(RuleOf(isLong, "text")["notes"][0]["text"], "its text 1.23457 has only six digits of the value");

  nlohmann::json const added = DocumentOf(Faulty("libHasWrongType.nsp.so"), {"--mof", "things.mof"});
  EXPECT_EQ(RuleOf(added, "schema")["notes"][0]["text"],
            "it is declared without a superclass; in the schema, that is CIM_Element");
  EXPECT_EQ(RuleOf(added, "schema")["notes"][1]["text"], "properties that the schema does not have: Added");
}

TEST_F(CheckTest, APlugInWithoutFaultsPassesWithItsFigures) {
  nlohmann::json const document = DocumentOf(Faulty("libGood.nsp.so"), {"--mof", "things.mof"});
  EXPECT_EQ(document["exitStatus"], 0) << document.dump(2);
  EXPECT_EQ(document["file"], fZep.Path("work/libGood.nsp.so"));
  EXPECT_EQ(document["plugIn"], "Good");
  EXPECT_EQ(document["schema"], "things.mof");
  for (nlohmann::json const& rule : document["rules"]) EXPECT_EQ(rule["status"], "passed") << rule.dump(2);
  EXPECT_EQ(document["rules"].size(), 15u);
  EXPECT_GT(document["figures"]["peakBytes"], 0);
  nlohmann::json const provider = document["figures"]["providers"][0];
  EXPECT_EQ(provider["name"], "Good");
  EXPECT_EQ(provider["namespace"], "root/faulty");
  EXPECT_EQ(provider["classes"][0]["name"], "X_Thing");
  EXPECT_EQ(provider["classes"][0]["instances"], 1);

  TRun const run = Check("libGood.nsp.so");
  EXPECT_EQ(run.fStatus, 0) << run.fErrors;
  EXPECT_THAT(run.fOutput, HasSubstr("Schema: none\n"));
  EXPECT_THAT(run.fOutput, testing::ContainsRegex("schema +not-checked +there is no schema; name a MOF file with"));
  EXPECT_THAT(run.fOutput, testing::ContainsRegex("read X_Thing +1 +[0-9.]+ ms"));
  EXPECT_EQ(run.fErrors, "");
}

TEST_F(CheckTest, TheTextNamesEachFinding) {
  TRun const run = Check(Faulty("libHasNoKey.nsp.so"));
  EXPECT_EQ(run.fStatus, 1);
  EXPECT_THAT(run.fOutput, testing::ContainsRegex("keys +found +X_Plain: instances without any key value"));
  EXPECT_EQ(run.fErrors, "zep: libHasNoKey.nsp.so: found: keys (1)\n");
}

TEST_F(CheckTest, EveryProviderPlugInAndTheExamplesPass) {
  TRecordedMachine const machine("server");
  TNames files = PlugInsOfTheBuild();
  for (char const* example : {CLOCK_PLUGIN, BATTERIES_PLUGIN, DISKS_PLUGIN}) files.push_back(example);
  for (std::string const& file : files) ExpectPassed(file, machine);

  NEEDS(!DmtfArchive().empty(), kNoDmtfSchema);
  TDmtfSchema const schema;
  ASSERT_TRUE(schema.IsThere());
  for (std::string const& file : files)
    EXPECT_EQ(RuleOf(ExpectPassed(file, machine, {"--mof", schema.MainFile()}), "schema")["status"], "passed");
}

TEST_F(CheckTest, AFileOrSchemaThatCannotBeReadIsNamed) {
  TRun const missing = Check("/nowhere/libGone.nsp.so");
  EXPECT_EQ(missing.fStatus, 1);
  EXPECT_EQ(missing.fOutput, "");
  EXPECT_EQ(missing.fErrors, "zep: /nowhere/libGone.nsp.so: No such file or directory\n");
  TRun const schema = Check(Faulty("libGood.nsp.so"), {"--mof", "/nowhere"});
  EXPECT_EQ(schema.fStatus, 1);
  EXPECT_THAT(schema.fErrors, HasSubstr("/nowhere"));
}

TEST_F(CheckTest, RootDoesNotLoadAPlugInThatOthersMayWrite) {
  NEEDS(::geteuid() == 0, "root");
  std::string const file = Faulty("libGood.nsp.so");
  fs::permissions(fZep.Path("work/" + file), fs::perms::others_write, fs::perm_options::add);
  nlohmann::json const document = DocumentOf(file);
  EXPECT_EQ(FoundIn(document), TNames{"name"}) << document.dump(2);
  EXPECT_THAT(RuleOf(document, "name")["findings"][0]["text"], HasSubstr("every user may write"));
  EXPECT_EQ(DocumentOf(file, {"--allow-writable"})["exitStatus"], 0);
}

}  // namespace
}  // namespace NQRVZEP20::zep
