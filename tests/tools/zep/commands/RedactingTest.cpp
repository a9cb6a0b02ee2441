// SPDX-License-Identifier: Apache-2.0

// zep report --redact and zep unredact.

#include "tests/collect/stored/StoredDocument.h"
#include "tests/tools/zep/Zep.h"

#include <gmock/gmock.h>

#include <sys/file.h>

namespace NQRVZEP20::zep {
namespace {

using testing::HasSubstr;
using testing::Not;

class RedactingTest : public testing::Test {
protected:
  RedactingTest() { Write("a.json", HealthyDocument()); }

  void Write(std::string const& name, std::string const& text) { WriteFile(fZep.Path(name), text); }

  TRun Run(std::vector<std::string> const& arguments) {
    TCall call = {arguments};
    call.fDirectory = fZep.Path("");
    call.fEnvironment = fEnvironment;
    call.fEnvironment["HOME"] = fZep.Path("home");
    call.fHasNoTerminal = true;
    return fZep.Run(call);
  }

  // The output of a call that must succeed.
  std::string OutputOf(std::vector<std::string> const& arguments) {
    TRun const run = Run(arguments);
    EXPECT_EQ(run.fStatus, 0) << testing::PrintToString(arguments) << run.fErrors;
    return run.fOutput;
  }

  TInstallation fZep;
  std::map<std::string, std::string> fEnvironment;
};

TEST_F(RedactingTest, TheMapIsAFileOfItsOwnerAndGivesTheOriginalBack) {
  std::string const original = OutputOf({"report", "--sample", "--json"});
  Write("original.json", original);
  TRun const run = Run({"report", "--from", "original.json", "--redact", "--json"});
  std::string const map = fZep.Path("home/.local/state/zep/redaction-map.json");
  EXPECT_EQ(run.fErrors, "zep: the redaction map is " + map + "\n");
  EXPECT_EQ(fs::status(map).permissions(), fs::perms::owner_read | fs::perms::owner_write);
  EXPECT_EQ(fs::status(fs::path(map).parent_path()).permissions(), fs::perms::owner_all);
  EXPECT_THAT(run.fOutput, Not(HasSubstr("KQ12345")));
  EXPECT_THAT(run.fOutput, HasSubstr("serial number serial-"));
  Write("redacted.json", run.fOutput);
  EXPECT_EQ(OutputOf({"unredact", "redacted.json"}), original);
  EXPECT_EQ(OutputOf({"unredact", "redacted.json", "--map", map}), original);
}

TEST_F(RedactingTest, EveryFormIsRedactedWithTheSamePseudonyms) {
  std::vector<std::string> const redact = {"report", "--sample", "--redact", "--redaction-map", "map"};
  auto const outputWith = [&](std::vector<std::string> const& more) {
    std::vector<std::string> arguments = redact;
    arguments.insert(arguments.end(), more.begin(), more.end());
    return OutputOf(arguments);
  };
  auto const document = nlohmann::json::parse(outputWith({"--json"}));
  std::string const serial = document["identity"]["serialNumber"]["value"], host = document["identity"]["hostName"]["value"];
  EXPECT_THAT(serial, testing::StartsWith("serial-"));
  EXPECT_THAT(host, testing::StartsWith("host-"));
  outputWith({"--html", "page"});
  for (std::string const& text : {outputWith({}), outputWith({"--full"}), outputWith({"--format", "jsonl"}),
                                  outputWith({"--section", "identity"}), ReadFile(fZep.Path("page"))}) {
    EXPECT_THAT(text, HasSubstr(serial));
    EXPECT_THAT(text, Not(HasSubstr("KQ12345")));
    EXPECT_THAT(text, Not(HasSubstr("sample-server")));
  }
}

TEST_F(RedactingTest, TwoRedactedReportsAreCompared) {
  Write("original.json", OutputOf({"report", "--sample", "--json"}));
  for (char const* file : {"first.json", "second.json"})
    Write(file, OutputOf({"report", "--from", "original.json", "--redact", "--redaction-map", "map", "--json"}));
  EXPECT_EQ(OutputOf({"diff", "first.json", "second.json"}), "no differences\n");
  EXPECT_EQ(OutputOf({"report", "--sample", "--redact", "--redaction-map", "map", "--since", "original.json"}),
            "no differences\n");
  EXPECT_EQ(OutputOf({"report", "--sample", "--redact", "--redaction-map", "map", "--since", "first.json"}), "no differences\n");
}

TEST_F(RedactingTest, ReportsThatAreNotRedactedAlikeAreNotCompared) {
  auto const write = [&](std::string const& file, std::string const& redact, std::string const& map) {
    Write(file, OutputOf({"report", "--sample", redact, "--redaction-map", map, "--json"}));
  };
  Write("original.json", OutputOf({"report", "--sample", "--json"}));
  write("first.json", "--redact", "map");
  write("other.json", "--redact", "other");
  write("serials.json", "--redact=serials", "map");
  std::string const remedy = "; redact both alike, or give the originals back with zep unredact";
  auto const whyNot = [&](std::string const& before, std::string const& after) {
    TRun const run = Run({"diff", before, after, "--json"});
    EXPECT_EQ(run.fStatus, 66);
    EXPECT_EQ("zep: " + std::string(JsonOf(run)["reason"]) + "\n", run.fErrors);
    return run.fErrors;
  };
  for (char const* file : {"other.json", "serials.json"})
    EXPECT_EQ(whyNot("first.json", file), "zep: first.json and " + std::string(file) +
                                              " cannot be compared: they were redacted with different maps or kinds, so that "
                                              "their pseudonyms do not agree" +
                                              remedy + "\n");
  EXPECT_EQ(whyNot("original.json", "first.json"),
            "zep: original.json and first.json cannot be compared: only first.json is redacted" + remedy + "\n");
  EXPECT_EQ(Run({"report", "--sample", "--since", "first.json"}).fStatus, 66);
}

TEST_F(RedactingTest, AReportWithoutTheSuperclassesIsRefused) {
  TRun const run = Run({"report", "--from", "a.json", "--redact", "--redaction-map", "map"});
  EXPECT_EQ(run.fStatus, 66);
  EXPECT_EQ(run.fErrors,
            "zep: the report cannot be redacted: an older zep wrote it, without the superclasses of its classes, which decide "
            "what is a secret\n");
}

TEST_F(RedactingTest, OnlyKnownKindsAreAccepted) {
  TRun const run = Run({"report", "--sample", "--redact", "serials,names"});
  EXPECT_EQ(run.fStatus, 64);
  EXPECT_THAT(run.fErrors, HasSubstr("--redact takes serials, hosts, addresses and users, separated by commas"));
  std::string const text = OutputOf({"report", "--sample", "--redact=hosts", "--redaction-map", "map"});
  EXPECT_THAT(text, HasSubstr("KQ12345"));
  EXPECT_THAT(text, Not(HasSubstr("sample-server")));
  EXPECT_EQ(Run({"report", "--sample", "--redaction-map", "map"}).fStatus, 64);
}

TEST_F(RedactingTest, AReportThatIsRedactedInPartIsNotTakenForRedacted) {
  Write("part.json", OutputOf({"report", "--sample", "--redact=serials", "--redaction-map", "map", "--json"}));
  TRun const run = Run({"report", "--from", "part.json", "--redact", "--redaction-map", "map"});
  EXPECT_EQ(run.fStatus, 66);
  EXPECT_THAT(run.fErrors, HasSubstr("the report was redacted without hosts, addresses, users"));
  OutputOf({"report", "--from", "part.json", "--redact=serials", "--redaction-map", "map"});
}

TEST_F(RedactingTest, ACutAlteredOrForeignFileIsRefusedByNameAndPlace) {
  Write("redacted.json", OutputOf({"report", "--sample", "--redact", "--redaction-map", "map", "--json"}));
  std::string const map = ReadFile(fZep.Path("map")), redacted = ReadFile(fZep.Path("redacted.json"));
  fs::copy_file(fZep.Path("map"), fZep.Path("other"));
  auto const whyRefused = [&](std::string const& file, std::string const& withMap) {
    TRun const run = Run({"unredact", file, "--map", withMap});
    EXPECT_EQ(run.fStatus, 66);
    EXPECT_EQ(run.fOutput, "");
    return run.fErrors;
  };
  Write("other", map.substr(0, map.size() / 2));
  EXPECT_THAT(whyRefused("redacted.json", "other"), testing::StartsWith("zep: other: line "));
  Write("other", WithReplaced(map, "\"KQ12345\"", "\"KQ12346\""));
  EXPECT_EQ(whyRefused("redacted.json", "other"), "zep: other: /sha256: does not match the values; it was altered\n");
  Write("other", redacted);
  EXPECT_EQ(whyRefused("redacted.json", "other"), "zep: other: it is not a redaction map of zep\n");
  EXPECT_EQ(whyRefused("redacted.json", "none"), "zep: none: No such file or directory\n");
  EXPECT_EQ(whyRefused("a.json", "map"), "zep: a.json: it is not redacted\n");
  Write("altered.json", WithReplaced(redacted, "serial number serial-1", "serial number serial-999"));
  EXPECT_THAT(whyRefused("altered.json", "map"), HasSubstr("zep: altered.json: /head/0: serial-999 is not in the map\n"));
  Write("cut.json", redacted.substr(0, 900));
  EXPECT_THAT(whyRefused("cut.json", "map"), testing::StartsWith("zep: cut.json: line "));
}

TEST_F(RedactingTest, AMapOfOthersIsRefused) {
  Write("redacted.json", OutputOf({"report", "--sample", "--redact", "--redaction-map", "map", "--json"}));
  std::string const map = fZep.Path("map");
  auto const expectRefused = [&](std::string const& why) {
    for (std::vector<std::string> const& call : {std::vector<std::string>{"unredact", "redacted.json", "--map", "map"},
                                                 {"report", "--sample", "--redact", "--redaction-map", "map"}}) {
      TRun const run = Run(call);
      EXPECT_EQ(run.fStatus, 66);
      EXPECT_EQ(run.fErrors, "zep: map: " + why + "\n");
    }
  };
  for (fs::perms const right : {fs::perms::others_read, fs::perms::group_write}) {
    fs::permissions(map, right, fs::perm_options::add);
    expectRefused("other users can read or change it; chmod 600 makes it private");
    fs::permissions(map, right, fs::perm_options::remove);
  }
  fs::resize_file(map, (16 << 20) + 1);
  expectRefused("it is longer than 16 MiB");
  if (::geteuid() != 0) GTEST_SKIP() << "only root can give a file to another user";
  ASSERT_EQ(::chown(map.c_str(), 65534, 65534), 0);
  fs::resize_file(map, 10);
  expectRefused("it belongs to another user; copy it to a file of your own");
}

TEST_F(RedactingTest, AMapThatIsInUseIsNamedWithTheRemedy) {
  std::vector<std::string> const call = {"report", "--sample", "--redact", "--redaction-map", "map"};
  int const lock = ::open(fZep.Path("map.lock").c_str(), O_RDWR | O_CREAT | O_CLOEXEC, 0600);
  ASSERT_EQ(::flock(lock, LOCK_EX), 0);
  TRun const run = Run(call);
  EXPECT_EQ(run.fStatus, 73);
  EXPECT_EQ(run.fErrors,
            "zep: map cannot be written: another zep is using the file; try again when it has ended (--redaction-map names "
            "another map)\n");
  ::close(lock);
  OutputOf(call);
  fs::create_directory(fZep.Path("map.lock"));
  EXPECT_EQ(Run(call).fErrors,
            "zep: map cannot be written: map.lock cannot be opened: Is a directory (--redaction-map names another map)\n");
}

// The report that is kept when it cannot be sent is the one that would have been sent.
TEST_F(RedactingTest, ASentReportAndItsNameAreRedacted) {
  fEnvironment = {{"TMPDIR", fZep.Path("")}, {"NETRC", "/dev/null"}};
  TRun const run = Run({"report", "--sample", "--redact", "--redaction-map", "map", "--json", "--send", "ftp://127.0.0.1:1/d/"});
  EXPECT_EQ(run.fStatus, 68);
  EXPECT_THAT(
      run.fErrors,
      testing::ContainsRegex(
          "zep: the report contains [0-9]+ serials, [0-9]+ hosts?, [0-9]+ address(es)? and [0-9]+ users?, all redacted\n"));
  TRun const quiet =
      Run({"report", "--sample", "--redact", "--redaction-map", "map", "--quiet", "--json", "--send", "ftp://127.0.0.1:1/d/"});
  EXPECT_THAT(quiet.fErrors, Not(HasSubstr("the report contains")));
  std::string const kept = nlohmann::json::parse(run.fOutput)["sent"]["keptIn"];
  EXPECT_THAT(kept, testing::ContainsRegex("zep-report-host-[0-9]+-2"));
  EXPECT_EQ(std::system(("gunzip -c '" + kept + "' > '" + fZep.Path("kept.json") + "'").c_str()), 0);
  EXPECT_THAT(ReadFile(fZep.Path("kept.json")), testing::AllOf(HasSubstr("serial-1"), Not(HasSubstr("KQ12345"))));
}

TEST_F(RedactingTest, AnUnwritablePageDoesNotPreventSending) {
  fEnvironment = {{"TMPDIR", fZep.Path("")}, {"NETRC", "/dev/null"}};
  TRun const run = Run({"report", "--sample", "--html", "/nowhere/page", "--send", "ftp://127.0.0.1:1/d/"});
  EXPECT_EQ(run.fStatus, 68);
  EXPECT_THAT(run.fErrors, HasSubstr("zep: the report contains "));
  EXPECT_THAT(run.fErrors, HasSubstr(", not redacted\n"));
  EXPECT_THAT(run.fErrors, HasSubstr("zep: the report is kept in "));
  EXPECT_THAT(run.fErrors, HasSubstr("zep: /nowhere/page cannot be written: No such file or directory\n"));
}

TEST_F(RedactingTest, ATerminalIsAskedOnceBeforeSending) {
  auto const errorsWith = [&](std::string const& answer, std::string const& options) {
    std::string const command = "{ " + answer + "; } | TMPDIR='" + fZep.Path("") + "' NETRC=/dev/null script -qec 'trap : INT; " +
                                fZep.Path("bin/zep") + " report --sample --send ftp://127.0.0.1:1/d/ " + options +
                                "; echo status $?' /dev/null > '" + fZep.Path("script") + "'";
    fs::remove(fZep.Path("script"));
    EXPECT_EQ(std::system(command.c_str()), 0);
    return ReadFile(fZep.Path("script"));
  };
  std::string const question = "zep: send it to 127.0.0.1? [y/N] ";
  EXPECT_THAT(errorsWith("echo n", ""),
              testing::AllOf(HasSubstr(question), HasSubstr("zep: the report was not sent"), HasSubstr("status 1")));
  EXPECT_THAT(errorsWith("echo y", ""),
              testing::AllOf(HasSubstr(question), HasSubstr("the report is kept in"), HasSubstr("status 68")));
  EXPECT_THAT(errorsWith("echo n", "--yes"), testing::AllOf(Not(HasSubstr("[y/N]")), HasSubstr("status 68")));
  std::string const controlCAtTheQuestion =
      "for try in $(seq 400); do grep -qs 'y/N' '" + fZep.Path("script") + "' && break; sleep 0.05; done; printf '\\003'";
  EXPECT_THAT(errorsWith(controlCAtTheQuestion, "--json"),
              testing::AllOf(HasSubstr("\"exitStatus\": 130"), HasSubstr("\"reason\": \"the report was not sent: interrupted\""),
                             HasSubstr("\"url\": null"), HasSubstr("status 130")));
}

}  // namespace
}  // namespace NQRVZEP20::zep
