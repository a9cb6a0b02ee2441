// SPDX-License-Identifier: Apache-2.0

// zep report --redact and zep unredact.

#include "tests/Machines.h"
#include "tests/collect/stored/StoredDocument.h"
#include "tests/tools/zep/Zep.h"

#include <gmock/gmock.h>

#include <sys/file.h>

#include <algorithm>
#include <cctype>
#include <cstdio>
#include <cstring>
#include <set>

namespace NQRVZEP20::zep {
namespace {

using testing::HasSubstr;
using testing::Not;

std::string Lower(std::string text) {
  for (char& byte : text) byte = static_cast<char>(std::tolower(static_cast<unsigned char>(byte)));
  return text;
}

std::string HexOf(std::string const& bytes, std::string const& separator) {
  char digits[3];
  std::string text;
  for (unsigned char const byte : bytes) {
    std::snprintf(digits, sizeof digits, "%02x", byte);
    text += (text.empty() ? "" : separator) + digits;
  }
  return text;
}

// The characters of the base64 form that do not depend on the bytes before and after.
std::string Base64(std::string const& value, std::size_t skipped) {
  char const digits[] = "ABCDEFGHIJKLMNOPQRSTUVWXYZabcdefghijklmnopqrstuvwxyz0123456789+/";
  std::string bits, text;
  for (unsigned char const byte : std::string(skipped, '\0') + value)
    for (int bit = 7; bit >= 0; --bit) bits += static_cast<char>('0' + (byte >> bit & 1));
  for (std::size_t at = (skipped * 8 + 5) / 6 * 6; at + 6 <= bits.size(); at += 6)
    text += digits[std::stoul(bits.substr(at, 6), nullptr, 2)];
  return text;
}

std::string Digits(std::string const& value) {
  std::string digits;
  for (char const byte : value)
    if (std::isxdigit(static_cast<unsigned char>(byte)) != 0) digits += byte;
  return digits;
}

std::string Reversed(std::string const& digits) {
  std::string reversed;
  for (std::size_t at = digits.size(); at >= 2; at -= 2) reversed += digits.substr(at - 2, 2);
  return reversed;
}

// The value in every encoding, in lower case.
std::set<std::string> EncodingsOf(std::string const& value) {
  std::string wide;
  for (char const byte : value) wide += std::string(1, byte) + '\0';
  std::string percent;
  for (unsigned char const byte : value)
    percent += std::isalnum(byte) != 0 ? std::string(1, static_cast<char>(byte)) : "%" + HexOf({static_cast<char>(byte)}, "");
  std::set<std::string> encodings = {value, nlohmann::json(value).dump(), wide, HexOf(wide, ""), percent};
  for (char const* separator : {"", ":", "-", " "}) encodings.insert(HexOf(value, separator));
  if (value.size() >= 6)  // shorter values have base64 forms that are common words
    for (std::size_t skipped : {0, 1, 2}) encodings.insert(Base64(value, skipped));
  std::string const digits = Digits(value);
  if (digits.size() == 32)
    for (std::string const& order :
         {digits, Reversed(digits),
          Reversed(digits.substr(0, 8)) + Reversed(digits.substr(8, 4)) + Reversed(digits.substr(12, 4)) + digits.substr(16)}) {
      encodings.insert(order);
      encodings.insert(order.substr(0, 8) + "-" + order.substr(8, 4) + "-" + order.substr(12, 4) + "-" + order.substr(16, 4) +
                       "-" + order.substr(20));
    }
  if (digits.size() == 12)
    for (char const* separator : {"", ":", "-"}) {
      std::string grouped;
      for (std::size_t at = 0; at < 12; at += 2) grouped += (at == 0 ? "" : separator) + digits.substr(at, 2);
      encodings.insert(grouped);
    }
  std::set<std::string> lower;
  for (std::string const& text : encodings) lower.insert(Lower(text));
  return lower;
}

// The values of the properties that a reader of the report would call secrets, without those that are the same everywhere.
std::set<std::string> SecretsOf(nlohmann::json const& document) {
  std::set<std::string> const names = {
      "SerialNumber",  "UUID",        "ContentUUID",      "TableUUID",        "UserTracking",
      "SystemName",    "CSName",      "PermanentAddress", "NetworkAddresses", "MACAddress",
      "IPv4Address",   "IPv6Address", "Gateway",          "PreferredSource",  "DNSServerAddresses",
      "SearchDomains", "AccessInfo"};
  std::set<std::string> const usual = {"0.0.0.0", "127.0.0.1", "::1", "000000000000", "0000:00:01.0"};
  std::set<std::string> secrets;
  for (auto const& instance : document["instances"])
    for (auto const& [name, property] : instance["properties"].items()) {
      if (names.count(name) == 0) continue;
      nlohmann::json values = property["value"];
      if (!values.is_array()) values = nlohmann::json::array({values});
      for (auto const& value : values)
        if (value.is_string() && value.get<std::string>().size() > 2 && usual.count(value) == 0)
          secrets.insert(value.get<std::string>());
    }
  return secrets;
}

bool IsLetters(std::string const& text) {
  return std::all_of(text.begin(), text.end(), [](unsigned char byte) { return std::isalpha(byte) != 0; });
}

bool IsWord(std::string const& text, std::size_t at, std::size_t size) {
  auto const isPart = [&](std::size_t place) {
    return place < text.size() && std::isalnum(static_cast<unsigned char>(text[place])) != 0;
  };
  return !(at > 0 && isPart(at - 1)) && !isPart(at + size);
}

// Whether the text, in lower case, contains the value. A value of letters alone, which may be part of another word, and one of
// digits and marks, which may be part of a number, must be a word.
bool Contains(std::string const& text, std::string const& value) {
  bool const isDistinct = value.size() >= 6 && value.find_first_of("0123456789") != value.npos &&
                          value.find_first_not_of("0123456789.") != value.npos;
  if (::memmem(text.data(), text.size(), value.data(), value.size()) == nullptr) return false;  // is faster than find
  for (std::size_t at = 0; (at = text.find(value, at)) != text.npos; ++at)
    if (isDistinct || IsWord(text, at, value.size())) return true;
  return false;
}

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

  // The output of a call, which is long, verbatim. It stays in the file.
  std::string LongOutputOf(std::string const& file, std::vector<std::string> const& arguments) {
    TCall call = {arguments};
    call.fDirectory = fZep.Path("");
    call.fEnvironment = fEnvironment;
    call.fOutputFile = fZep.Path(file);
    EXPECT_LT(fZep.Run(call).fStatus, 3);
    return ReadFile(fZep.Path(file));
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
    std::string const command = "printf '" + answer + "\\n' | TMPDIR='" + fZep.Path("") + "' NETRC=/dev/null script -qec '" +
                                fZep.Path("bin/zep") + " report --sample --send ftp://127.0.0.1:1/d/ " + options +
                                "; echo status $?' /dev/null > '" + fZep.Path("script") + "'";
    EXPECT_EQ(std::system(command.c_str()), 0);
    return ReadFile(fZep.Path("script"));
  };
  std::string const question = "zep: send it to 127.0.0.1? [y/N] ";
  EXPECT_THAT(errorsWith("n", ""),
              testing::AllOf(HasSubstr(question), HasSubstr("zep: the report was not sent"), HasSubstr("status 1")));
  EXPECT_THAT(errorsWith("y", ""),
              testing::AllOf(HasSubstr(question), HasSubstr("the report is kept in"), HasSubstr("status 68")));
  EXPECT_THAT(errorsWith("n", "--yes"), testing::AllOf(Not(HasSubstr("[y/N]")), HasSubstr("status 68")));
}

// A full report on the recorded server, with every provider.
TEST_F(RedactingTest, NoSecretRemainsInAnyEncoding) {
  TRecordedMachine const machine("server");
  for (char const* name : {"Storage", "Network", "Devices", "Sensors"})
    fZep.Add("lib" + std::string(name) + ".nsp.so", TEST_LIB_DIR "/lib" + std::string(name) + ".nsp.so");
  fEnvironment = {{"ZEP_ROOT", machine.Root()}};
  std::string const original = LongOutputOf("original.json", {"report", "--json", "--plugin-timeout", "60"});
  std::string const redacted = LongOutputOf(
      "redacted.json", {"report", "--from", "original.json", "--redact", "--redaction-map", "map", "--json", "--html", "page"});
  auto const secrets = SecretsOf(nlohmann::json::parse(original));
  ASSERT_GT(secrets.size(), 40u);
  std::string const text = Lower(redacted), page = Lower(ReadFile(fZep.Path("page")));
  for (std::string const& secret : secrets) {
    EXPECT_TRUE(IsLetters(secret) || !Contains(page, Lower(secret))) << secret << " in the page";
    for (std::string const& encoding : EncodingsOf(secret)) {
      if (encoding == secret && IsLetters(secret)) continue;  // "server" is also a word, as in "Server Q100"
      EXPECT_FALSE(Contains(text, encoding)) << secret << " as " << encoding;
    }
  }
  EXPECT_THAT(redacted, Not(HasSubstr("\"server\""))) << "the host, also in the keys of paths";
  EXPECT_EQ(LongOutputOf("back.json", {"unredact", "redacted.json", "--map", "map"}), original);
}

}  // namespace
}  // namespace NQRVZEP20::zep
