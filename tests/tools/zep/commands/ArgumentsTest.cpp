// SPDX-License-Identifier: Apache-2.0

// The messages of zep for wrong usage, for every command.

#include "tests/tools/zep/Zep.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

namespace NQRVZEP20::zep {
namespace {

class ArgumentsTest : public testing::Test {
protected:
  TRun Run(std::vector<std::string> const& arguments) {
    TCall call = {arguments};
    call.fHasNoTerminal = true;
    return fZep.Run(call);
  }

  void ExpectWrongUsage(std::vector<std::string> const& arguments, std::string const& why) {
    SCOPED_TRACE(testing::PrintToString(arguments));
    TRun const run = Run(arguments);
    EXPECT_EQ(run.fStatus, 64);
    EXPECT_EQ(run.fOutput, "");
    EXPECT_EQ(run.fErrors, "zep: " + why + "\n");
  }

  TInstallation fZep;
};

TEST_F(ArgumentsTest, WrongUsageIsReportedWithoutRepeatingTheArguments) {
  struct TRow {
    std::vector<std::string> fArguments;
    std::string fErrors;
  };
  TRow const rows[] = {
      {{"remote", "h", "--user", "u", "--password", "SECRET1"}, "unknown option --password"},
      {{"remote", "h", "--user", "u", "--password=SECRET1"}, "unknown option --password"},
      {{"remote", "h", "--user", "u", "-pSECRET1"}, "unknown option -p"},
      {{"remote", "h", "SECRET1", "--user", "u"}, "one unexpected argument"},
      {{"remote", "h", "SECRET1", "SECRET1", "--user", "u"}, "2 unexpected arguments"},
      {{"remote", "h", "--user", "u", "--parallel", "SECRET1"}, "--parallel takes INT in [1 - 1000]"},
      {{"remote", "h", "--user", "u", "--parallel", "1001"}, "--parallel takes INT in [1 - 1000]"},
      {{"remote", "h", "--user"}, "--user: 1 required TEXT missing"},
      {{"remote", "h"}, "--user is required"},
      {{"send", "--stall", "ftp://u:SECRET1@h/x", "f", "h"}, "--stall takes INT in [0 - 86400]"},
      {{"send", "f", "h", "ftp://u:SECRET1@h/x"}, "one unexpected argument"},
      {{"send", "f", "--", "h", "ftp://u:SECRET1@h/x"}, "one unexpected argument"},
      {{"report", "--json=SECRET1"}, "--json takes no value"},
      {{"report", "--send", "SECRET1", "--send", "h"}, "--send: At Most 1 required but received 2"},
      {{"run", "--password=SECRET1", "true"}, "unknown option --password"},
      {{"run", "--timeout", "SECRET1", "true"}, "--timeout takes INT in [-1 - 2147483647]"},
      {{"show", "a", "--mof", "SECRET1", "--sample"}, "--mof excludes --sample"},
      {{"show"}, "path is required"},
      {{"SECRET1"}, "unknown command"},
      {{"ftp://u:SECRET1@h/x"}, "unknown command"},
      {{"--password", "SECRET1"}, "unknown option --password"},
      {{"--password=SECRET1", "report"}, "unknown option --password"},
      {{"media", "SECRET1"}, "unknown command"},
      {{"media", "mount", "/dev/sdz", "SECRET1"}, "one unexpected argument"},
  };
  for (TRow const& row : rows) ExpectWrongUsage(row.fArguments, row.fErrors);
}

TEST_F(ArgumentsTest, UnknownCommandIsNamed) {
  EXPECT_EQ(Run({"bogus"}).fErrors, "zep: unknown command \"bogus\"\n");
  EXPECT_EQ(Run({"bogus", "--json"}).fErrors, "zep: unknown command \"bogus\"\n");
  EXPECT_EQ(Run({"media", "eject"}).fErrors, "zep: unknown command \"eject\"\n");
  EXPECT_EQ(Run({}).fErrors, "zep: a command is required; zep --help lists all commands\n");
}

TEST_F(ArgumentsTest, ArgumentsAreEscapedInMessages) {
  for (std::vector<std::string> const& arguments : {std::vector<std::string>{"\x1b[2J"},
                                                    {"--\x1b[2J"},
                                                    {"show", "a", "\x1b[2J"},
                                                    {"show", "a", "--\x1b[2J"},
                                                    {"run", "-\x1b", "true"},
                                                    {"remote", "h", "--user", "u", "--timeout", "\x1b[2J"}}) {
    SCOPED_TRACE(testing::PrintToString(arguments));
    TRun const run = Run(arguments);
    EXPECT_EQ(run.fStatus, 64);
    EXPECT_THAT(run.fErrors, testing::StartsWith("zep: "));
    EXPECT_EQ(run.fErrors.find('\x1b'), std::string::npos);
  }
  EXPECT_EQ(Run({"show", "a", "--\x1b[2J"}).fErrors, "zep: unknown option --\\x1b[2J\n");
}

TEST_F(ArgumentsTest, EmptyArgumentsAreRefused) {
  struct TRow {
    std::vector<std::string> fArguments;
    std::string fName;
  };
  TRow const rows[] = {
      {{"report", "--send", ""}, "--send"},
      {{"report", "--send="}, "--send"},
      {{"report", "--to-media", ""}, "--to-media"},
      {{"report", "--netrc", ""}, "--netrc"},
      {{"show", "--mof", "", "X"}, "--mof"},
      {{"show", ""}, "path"},
      {{"classes", "--mof", ""}, "--mof"},
      {{"mof", ""}, "file"},
      {{"plugin", "new", "", "--class", "X"}, "name"},
      {{"plugin", "new", "A", "--class="}, "--class"},
      {{"media", "mount", ""}, "device"},
      {{"media", "umount", ""}, "directory"},
      {{"config", ""}, "key"},
      {{"remote", "", "--user", "u"}, "host"},
      {{"remote", "h", "--user", ""}, "--user"},
      {{"remote", "--user", "u", "--hosts", ""}, "--hosts"},
      {{"remote", "h", "--user", "u", "--debug-log", ""}, "--debug-log"},
      {{"remote", "h", "--user", "u", "--password-file", ""}, "--password-file"},
      {{"remote", "h", "--user", "u", "--timeout", ""}, "--timeout"},
      {{"remote", "h", "--user=", "u"}, "--user"},
      {{"run", "--timeout=", "5", "true"}, "--timeout"},
      {{"send", "", "h"}, "file"},
      {{"send", "f", ""}, "target"},
      {{"send", "f", "h", "--as", ""}, "--as"},
      {{"get", "ftp://h/f", ""}, "file"},
      {{"proxy-check", ""}, "proxy"},
  };
  for (TRow const& row : rows) ExpectWrongUsage(row.fArguments, row.fName + " must not be empty");
}

TEST_F(ArgumentsTest, HelpThatCannotBeWrittenIsAFailure) {
  for (std::vector<std::string> const& arguments :
       {std::vector<std::string>{"--help"}, {"report", "--help"}, {"media", "mount", "--help"}, {"--version"}}) {
    SCOPED_TRACE(testing::PrintToString(arguments));
    TCall call = {arguments};
    call.fOutputFile = "/dev/full";
    TRun const run = fZep.Run(call);
    EXPECT_EQ(run.fStatus, 1);
    EXPECT_EQ(run.fErrors, "zep: standard output cannot be written: No space left on device\n");
    TRun const written = Run(arguments);
    EXPECT_EQ(written.fStatus, 0);
    EXPECT_NE(written.fOutput, "");
  }
}

}  // namespace
}  // namespace NQRVZEP20::zep
