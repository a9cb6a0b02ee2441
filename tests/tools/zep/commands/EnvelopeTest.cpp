// SPDX-License-Identifier: Apache-2.0

// The exit status and the JSON document of every command of zep, when it succeeds and when it fails.

#include "tests/collect/stored/StoredDocument.h"
#include "tests/tools/zep/Envelope.h"
#include "tests/tools/zep/Zep.h"

#include <gmock/gmock.h>

#include <set>

namespace NQRVZEP20::zep {
namespace {

// A call with --json, and its exit status.
struct TRow {
  std::string fDocument;
  int fStatus;
  std::vector<std::string> fArguments;
};

class EnvelopeTest : public testing::Test {
protected:
  EnvelopeTest() {
    fs::create_directory(fZep.Path("work"));
    fs::create_directory(fZep.Path("empty"));
    Write("zep.cfg", "a=1\n");
    Write("good.mof", "class X_A { uint32 A; };\n");
    Write("bad.mof", "class\n");
    Write("there", "");
    Write("hosts", "one\ntwo\n");
    Write("a.json", HealthyDocument());
    Write("b.json", HealthyDocumentWith("db1", "db2"));
  }

  void Write(std::string const& name, std::string const& text) { WriteFile(fZep.Path("work/" + name), text); }

  TRun Run(std::vector<std::string> const& arguments, std::string const& directory = "work") {
    TCall call = {arguments};
    call.fEnvironment = {
        {"ZEP_SMBIOS_TABLE", "/nowhere"}, {"HOME", "/nowhere"}, {"NETRC", "/dev/null"}, {"TMPDIR", fZep.Path("work")}};
    call.fDirectory = fZep.Path(directory);
    call.fHasNoTerminal = true;
    return fZep.Run(call);
  }

  void Expect(TRow const& row) {
    SCOPED_TRACE(testing::PrintToString(row.fArguments));
    TRun const run = Run(row.fArguments);
    EXPECT_EQ(run.fStatus, row.fStatus) << run.fErrors;
    ExpectEnvelope(run.fOutput, run.fStatus, row.fDocument);
  }

  // The names below "Subcommands:", each after the name of its command.
  std::vector<std::string> NamesIn(std::vector<std::string> const& command) {
    std::vector<std::string> arguments = command;
    arguments.push_back("--help");
    std::string const help = Run(arguments).fOutput;
    std::string const title = "Subcommands:\n";
    std::size_t const start = help.find(title);
    if (start == help.npos) return {};
    std::vector<std::string> names;
    for (std::string const& line : LinesOf(help.substr(start + title.size()))) {
      if (line.empty()) break;
      if (line.compare(0, 2, "  ") == 0 && line.compare(0, 3, "   ") != 0) names.push_back(line.substr(2, line.find(' ', 2) - 2));
    }
    return names;
  }

  // All commands that zep --help lists, such as "zep media mount".
  std::set<std::string> Commands() {
    std::set<std::string> commands;
    for (std::string const& name : NamesIn({})) {
      commands.insert("zep " + name);
      for (std::string const& below : NamesIn({name})) commands.insert("zep " + name + " " + below);
    }
    return commands;
  }

  // The command, among `commands`, that the words name.
  static std::string CommandOf(std::set<std::string> const& commands, std::vector<std::string> const& arguments) {
    std::string command = "zep";
    for (std::string const& argument : arguments)
      if (commands.count(command + " " + argument) > 0) command += " " + argument;
    return command;
  }

  // The commands that have no row and are not among `others`.
  template <class TRows>
  std::set<std::string> Missing(TRows const& rows, std::set<std::string> const& others) {
    std::set<std::string> const commands = Commands();
    EXPECT_GT(commands.size(), 10u) << "the list of zep --help should be parsed completely";
    std::set<std::string> missing = commands;
    for (std::string const& other : others) missing.erase(other);
    for (TRow const& row : rows) missing.erase(CommandOf(commands, row.fArguments));
    return missing;
  }

  TInstallation fZep;
};

// A command that is missing here makes the test fail.
TEST_F(EnvelopeTest, EveryCommandThatFailsPrintsADocumentWithItsExitStatus) {
  TRow const rows[] = {
      {"zep report", 68, {"report", "--json", "--sample", "--send", "ftp://127.0.0.1:1/d/"}},
      {"zep report", 64, {"report", "--json", "--sample", "--send", "ftp://127.0.0.1:1/d/", "--netrc", "/nowhere"}},
      {"zep report", 2, {"report", "--json"}},
      {"zep report --to-media", 1, {"report", "--json", "--sample", "--to-media", "/dev/no-such-device"}},
      {"zep report", 64, {"report", "--format", "json", "--since", "there"}},
      {"zep report", 66, {"report", "--json", "--since", "there"}},
      {"zep report", 64, {"report", "--json", "--from", "a.json"}},
      {"zep report", 66, {"report", "--json", "--replay", "there"}},
      {"zep record", 73, {"record", "--json", "/nowhere/recording"}},
      {"zep report", 64, {"report", "--json", "--sample", "--redact", "names"}},
      {"zep report", 73, {"report", "--json", "--sample", "--redact", "--redaction-map", "/nowhere/map"}},
      {"zep unredact", 66, {"unredact", "--json", "there", "--map", "there"}},
      {"zep unredact", 66, {"unredact", "--json", "a.json", "--map", "there"}},
      {"zep report", 66, {"report", "--json", "--bundle", "bundle", "--sign", "there"}},
      {"zep report", 73, {"report", "--json", "--sample", "--bundle", "/nowhere/bundle"}},
      {"zep verify", 66, {"verify", "--json", "there"}},
      {"zep verify", 66, {"verify", "--json", "there", "--ca", "there"}},
      {"zep diff", 66, {"diff", "--json", "there", "there"}},
      {"zep diff", 1, {"diff", "--json", "a.json", "b.json"}},
      {"zep diff", 73, {"diff", "--json", "a.json", "b.json", "--html", "/nowhere/page"}},
      {"zep report --since", 1, {"report", "--json", "--sample", "--since", "a.json"}},
      {"zep show", 1, {"show", "X_None", "--json"}},
      {"zep show", 1, {"show", "X_None", "--json", "--mof", "bad.mof"}},
      {"zep classes", 1, {"classes", "--json", "--mof", "/nowhere"}},
      {"zep plugins", 2, {"plugins", "--json", "--plugin", "/nowhere"}},
      {"zep mof", 1, {"mof", "--json", "bad.mof"}},
      {"zep doctor", 2, {"doctor", "--json"}},
      {"zep plugin", 64, {"plugin", "--json"}},
      {"zep plugin new", 1, {"plugin", "new", "--json", "New", "--class", "X_None", "--mof", "good.mof"}},
      {"zep plugin new", 64, {"plugin", "new", "--json", "not-a-name", "--class", "X_A", "--mof", "good.mof"}},
      {"zep plugin check", 1, {"plugin", "check", "--json", "/nowhere"}},
      {"zep plugin check", 1, {"plugin", "check", "--json", "good.mof"}},
      {"zep media", 1, {"media", "--json"}},
      {"zep media", 1, {"media", "list", "--json"}},
      {"zep media mount", 1, {"media", "mount", "--json", "/dev/no-such-device"}},
      {"zep media mount", 64, {"media", "--json", "mount", "/etc/passwd"}},
      {"zep media umount", 1, {"media", "umount", "--json", "/mnt/no-such-medium"}},
      {"zep config", 1, {"config", "--json", "no-such-key"}},
      {"zep remote", 1, {"remote", "--json", "192.0.2.1", "--user", "u"}},
      {"zep remote", 1, {"remote", "--json", "192.0.2.1", "--user", "u", "--inventory"}},
      {"zep remote", 1, {"remote", "--json", "192.0.2.1", "--user", "u", "--password-file", "/nowhere"}},
      {"zep remote", 1, {"remote", "--json", "192.0.2.1", "--user", "u", "--password-file", "there"}},
      {"zep remote", 1, {"remote", "--json", "192.0.2.1", "--user", "u", "--password-file", "zep.cfg"}},
      {"zep remote", 1, {"remote", "--json", "--hosts", "/nowhere", "--user", "u"}},
      {"zep remote", 64, {"remote", "--json", "--user", "u"}},
      {"zep run", 1, {"run", "--json", "false"}},
      {"zep run", 1, {"run", "--timeout", "5", "--json", "/nowhere/program", "--help"}},
      {"zep send", 66, {"send", "--json", "/nowhere", "ftp://127.0.0.1:1/"}},
      {"zep send", 68, {"send", "--json", "there", "ftp://127.0.0.1:1/"}},
      {"zep send", 64, {"send", "--json", "there", "http://127.0.0.1:1/"}},
      {"zep get", 73, {"get", "--json", "ftp://127.0.0.1:1/f", "there"}},
      {"zep get", 73, {"get", "--json", "ftp://127.0.0.1:1/f", "/dev/null"}},
      {"zep get", 68, {"get", "--json", "ftp://127.0.0.1:1/f", "new"}},
      {"zep get", 64, {"get", "--json", "f", "new"}},
      {"zep proxy-check", 68, {"proxy-check", "--json", "127.0.0.1:1"}},
      {"zep proxy-check", 64, {"proxy-check", "--json", "127.0.0.1"}},
      {"zep help", 64, {"help", "--json", "bogus"}},
      {"zep help", 64, {"help", "--json", "--completion", "bash", "report"}},
  };
  for (TRow const& row : rows) Expect(row);
  EXPECT_THAT(Missing(rows, {"zep wpad"}), testing::IsEmpty()) << "zep wpad has a test of its own, below";
}

// Runs zep without privileges, because as root it would query the network.
TEST_F(EnvelopeTest, WpadWithoutPermissionToListenPrintsADocument) {
  TCall call = {{"wpad", "--json", "--no-stop"}};
  call.fAsNobody = true;
  TRun const run = fZep.Run(call);
  EXPECT_EQ(run.fStatus, 1);
  ExpectEnvelope(run.fOutput, 1, "zep wpad");
}

// The commands that are missing here need a server or a device; tests/system checks their documents.
TEST_F(EnvelopeTest, EveryCommandThatSucceedsPrintsADocumentWithItsExitStatus) {
  Write("redacted.json", Run({"report", "--sample", "--json", "--redact", "--redaction-map", "map"}).fOutput);
  TRow const rows[] = {
      {"zep report", 0, {"report", "--json", "--sample"}},
      {"zep record", 0, {"record", "--json", "recording"}},
      {"zep report", 0, {"report", "--json", "--sample", "--redact", "--redaction-map", "map"}},
      {"zep report", 0, {"unredact", "--json", "redacted.json", "--map", "map"}},
      {"zep report", 0, {"report", "--json", "--sample", "--bundle", "bundle"}},
      {"zep verify", 0, {"verify", "--json", "bundle"}},
      {"zep diff", 0, {"diff", "--json", "a.json", "a.json"}},
      {"zep show", 0, {"show", "CIM_Chassis", "--json", "--sample"}},
      {"zep show", 0, {"show", "X_A", "--json", "--mof", "good.mof"}},
      {"zep classes", 0, {"classes", "--json", "--sample"}},
      {"zep classes", 0, {"classes", "--json", "--tree", "--mof", "good.mof"}},
      {"zep plugins", 0, {"plugins", "--json", "--sample"}},
      {"zep mof", 0, {"mof", "--json", "good.mof"}},
      {"zep plugin new", 0, {"plugin", "new", "--json", "New", "--class", "X_A", "--mof", "good.mof"}},
      {"zep plugin check", 0, {"plugin", "check", "--json", "../lib/libHost.nsp.so"}},
      {"zep config", 0, {"config", "--json"}},
      {"zep config", 0, {"config", "--json", "a"}},
      {"zep run", 0, {"run", "--json", "echo", "--json=x"}},
      {"zep help", 0, {"help", "--json"}},
      {"zep help", 0, {"help", "--json", "--completion", "bash"}},
      {"zep help", 0, {"help", "--json", "media", "mount"}},
  };
  for (TRow const& row : rows) Expect(row);
  std::set<std::string> const elsewhere = {"zep doctor",      "zep get",          "zep media",  "zep media list",
                                           "zep media mount", "zep media umount", "zep plugin", "zep proxy-check",
                                           "zep remote",      "zep send",         "zep wpad"};
  EXPECT_THAT(Missing(rows, elsewhere), testing::IsEmpty());
}

TEST_F(EnvelopeTest, WrongUsageOfEveryCommandPrintsADocument) {
  for (std::string const& command : Commands()) {
    std::vector<std::string> arguments;
    std::istringstream words(command.substr(std::string("zep ").size()));
    for (std::string word; words >> word;) arguments.push_back(word);
    arguments.insert(arguments.end(), {"--json", "--no-such-option"});
    Expect({command == "zep media list" ? "zep media" : command, 64, arguments});
  }
  TRow const rows[] = {
      {"zep", 64, {"--json"}},
      {"zep", 64, {"bogus", "--json"}},
      {"zep remote", 64, {"remote", "h", "--user=", "--json"}},
      {"zep remote", 64, {"remote", "h", "--user", "u", "--parallel", "x", "--json"}},
      {"zep media", 64, {"media", "--json", "eject"}},
      {"zep run", 64, {"run", "--json"}},
  };
  for (TRow const& row : rows) Expect(row);
}

TEST_F(EnvelopeTest, WithoutJsonOrAfterACommandToRunThereIsNoDocument) {
  EXPECT_EQ(Run({"get", "ftp://127.0.0.1:1/f", "there"}).fOutput, "");
  EXPECT_EQ(Run({"run", "--no-such-option", "true", "--json"}).fOutput, "");
  EXPECT_EQ(Run({"run", "echo", "--json"}).fOutput, "--json\n");
  EXPECT_EQ(Run({"config", "--", "--json"}).fOutput, "");
}

TEST_F(EnvelopeTest, AReportInLinesBeginsWithItsDocument) {
  TRun const run = Run({"report", "--format", "jsonl", "--sample"});
  EXPECT_EQ(run.fStatus, 0);
  ASSERT_GT(LinesOf(run.fOutput).size(), 50u);
  auto const first = nlohmann::json::parse(LinesOf(run.fOutput).front());
  EXPECT_EQ(first["document"], "zep report");
  EXPECT_EQ(first["exitStatus"], 0);
  ExpectEnvelope(Run({"report", "--format=jsonl", "--no-such-option"}).fOutput, 64, "zep report");
  Expect({"zep report --to-media", 64, {"report", "--format", "jsonl", "--to-media", "/dev/sdz"}});
  EXPECT_EQ(Run({"report", "--format", "json", "--sample"}).fStatus, 0);
  EXPECT_EQ(Run({"report", "--format", "yaml", "--sample"}).fStatus, 64);
}

TEST_F(EnvelopeTest, EachHostOfAListHasItsOwnDocumentOnOneLine) {
  Write("password", "p\n");
  TRun const run = Run({"remote", "--hosts", "hosts", "--user", "u", "--password-file", "password"});
  EXPECT_EQ(run.fStatus, 1);
  ASSERT_EQ(LinesOf(run.fOutput).size(), 2u);
  for (std::string const& line : LinesOf(run.fOutput)) ExpectEnvelope(line, 1, "zep remote");
  TRun const failed = Run({"remote", "--json", "--hosts", "/nowhere", "--user", "u"});
  ASSERT_EQ(LinesOf(failed.fOutput).size(), 1u);
}

TEST_F(EnvelopeTest, WhenAReportCannotBeSentTheFileThatKeepsItIsNamed) {
  TCall call = {{"report", "--json", "--sample", "--send", "ftp://127.0.0.1:1/d/"}};
  call.fEnvironment = {{"TMPDIR", fZep.Path("work")}, {"NETRC", "/dev/null"}};
  TRun const run = fZep.Run(call);
  EXPECT_EQ(run.fStatus, 68);
  auto const document = JsonOf(run);
  EXPECT_EQ(document["status"], "complete");
  EXPECT_THAT(document["reason"].get<std::string>(), testing::StartsWith("the report was not sent: "));
  EXPECT_THAT(document["sent"]["keptIn"].get<std::string>(), testing::StartsWith(fZep.Path("work/zep-report.")));
  EXPECT_TRUE(fs::exists(document["sent"]["keptIn"].get<std::string>()));
  EXPECT_TRUE(document["sent"]["sha256"].is_null());
  EXPECT_EQ(document["sent"]["leftOnServer"], nlohmann::json::array());
}

TEST_F(EnvelopeTest, ADocumentThatCannotBeWrittenIsWrittenOnlyOnce) {
  TCall call = {{"config", "--json"}};
  call.fOutputFile = "/dev/full";
  TRun const run = fZep.Run(call);
  EXPECT_EQ(run.fStatus, 1);
  EXPECT_EQ(run.fErrors, "zep: standard output cannot be written: No space left on device\n");
  call.fArguments.push_back("--no-such-option");
  TRun const wrong = fZep.Run(call);
  EXPECT_EQ(wrong.fStatus, 64);
  EXPECT_EQ(wrong.fErrors,
            "zep: unknown option --no-such-option\nzep: standard output cannot be written: No space left on device\n");
}

}  // namespace
}  // namespace NQRVZEP20::zep
