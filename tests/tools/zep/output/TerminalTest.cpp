// SPDX-License-Identifier: Apache-2.0

// Tests the output of zep on a terminal: it is as wide as the terminal, and consists of plain lines on a dumb one.

#include "tools/zep/output/Terminal.h"

#include "tests/tools/zep/Zep.h"

#include <gmock/gmock.h>
#include <pty.h>
#include <sys/ioctl.h>

namespace NQRVZEP20::zep {
namespace {

using testing::HasSubstr;
using testing::Not;

TEST(TerminalTest, ColumnsAreANumberThatATerminalCanHave) {
  for (char const* text : {"", "x", "80x", " 80", "-80", "19", "1001", "99999999999999999999"})
    EXPECT_EQ(ColumnsFrom(text), 0u) << text;
  EXPECT_EQ(ColumnsFrom("20"), 20u);
  EXPECT_EQ(ColumnsFrom("132"), 132u);
  EXPECT_EQ(ColumnsFrom("1000"), 1000u);
}

class AtTerminalTest : public testing::Test {
protected:
  // Returns the output of zep on a terminal with that many columns, without the carriage returns of the line ends.
  std::string Shown(std::vector<std::string> const& arguments, unsigned short columns,
                    std::map<std::string, std::string> const& environment = {}) {
    winsize size{};
    size.ws_col = columns;
    size.ws_row = 25;
    int terminal = -1;
    pid_t const child = ::forkpty(&terminal, nullptr, nullptr, &size);
    if (child == 0) Exec(arguments, environment);
    std::string shown;
    char chunk[4096];
    for (ssize_t got = 0; (got = ::read(terminal, chunk, sizeof chunk)) > 0;) shown.append(chunk, static_cast<std::size_t>(got));
    ::waitpid(child, nullptr, 0);
    ::close(terminal);
    return std::regex_replace(shown, std::regex("\r\n"), "\n");
  }

  static std::size_t LongestLineOf(std::string const& text) {
    std::size_t longest = 0;
    for (std::string const& line : LinesOf(text)) longest = std::max(longest, line.size());
    return longest;
  }

  TInstallation fZep;

private:
  [[noreturn]] void Exec(std::vector<std::string> const& words, std::map<std::string, std::string> const& environment) {
    ::unsetenv("COLUMNS");
    ::setenv("TERM", "xterm", 1);
    for (auto const& [name, value] : environment) ::setenv(name.c_str(), value.c_str(), 1);
    std::string const program = fZep.Path("bin/zep");
    std::vector<char*> arguments = {const_cast<char*>("zep")};
    for (std::string const& word : words) arguments.push_back(const_cast<char*>(word.c_str()));
    arguments.push_back(nullptr);
    ::execv(program.c_str(), arguments.data());
    ::_exit(127);
  }
};

// A value that is longer than a column of a narrow table.
std::string const kWords = "twelve words that are as long as they need be to fill a whole line and more";

TEST_F(AtTerminalTest, ATableIsAsWideAsTheTerminal) {
  WriteFile(fZep.Path("a.mof"), "class X_A { string PropertyWithAName = \"" + kWords + "\"; };\n");
  std::vector<std::string> const call = {"show", "X_A", "--mof", fZep.Path("a.mof")};
  EXPECT_LE(LongestLineOf(Shown(call, 80)), 80u);
  EXPECT_THAT(Shown(call, 80), Not(HasSubstr(kWords)));
  EXPECT_THAT(Shown(call, 160), HasSubstr(kWords)) << "the terminal is wide enough for one line";
  EXPECT_LE(LongestLineOf(Shown(call, 60)), 60u);
  EXPECT_THAT(Shown(call, 60), HasSubstr("PropertyWithAName "));
}

TEST_F(AtTerminalTest, ColumnsOverridesTheSystem) {
  WriteFile(fZep.Path("a.mof"), "class X_A { string PropertyWithAName = \"" + kWords + "\"; };\n");
  std::vector<std::string> const call = {"show", "X_A", "--mof", fZep.Path("a.mof")};
  EXPECT_THAT(Shown(call, 80, {{"COLUMNS", "160"}}), HasSubstr(kWords));
  EXPECT_LE(LongestLineOf(Shown(call, 160, {{"COLUMNS", "60"}})), 60u);
  EXPECT_LE(LongestLineOf(Shown(call, 80, {{"COLUMNS", "wide"}})), 80u);
}

TEST_F(AtTerminalTest, NoWordIsTruncated) {
  for (unsigned short const columns : {40, 80}) {
    std::string const shown = Shown({"show", "CIM_PhysicalMemory", "--sample"}, columns);
    EXPECT_THAT(shown, HasSubstr("\nConfiguredMemoryClockSpeed ")) << columns;
  }
  EXPECT_THAT(fZep.Run({{"show", "CIM_PhysicalMemory", "--sample"}}).fOutput, HasSubstr("\nConfiguredMemoryClockSpeed "));
}

TEST_F(AtTerminalTest, ADumbTerminalGetsPlainLines) {
  WriteFile(fZep.Path("a.mof"), "class X_A { string PropertyWithAName = \"" + kWords + "\"; };\n");
  std::string const shown = Shown({"show", "X_A", "--mof", fZep.Path("a.mof")}, 60, {{"TERM", "dumb"}});
  EXPECT_THAT(shown, HasSubstr(kWords)) << "a row is one line";
  EXPECT_EQ(shown.find('\x1b'), std::string::npos);
  EXPECT_EQ(shown.find('\r'), std::string::npos);
}

TEST_F(AtTerminalTest, AListOfHostsShowsItsProgressInPlainLines) {
  WriteFile(fZep.Path("hosts"), "one\ntwo\n");
  WriteFile(fZep.Path("password"), "p\n");
  std::vector<std::string> const call = {"remote", "--hosts",         fZep.Path("hosts"),   "--user",
                                         "u",      "--password-file", fZep.Path("password")};
  EXPECT_THAT(Shown(call, 80), HasSubstr("\rzep: 2 of 2 hosts done, 2 failed\n"));
  std::string const dumb = Shown(call, 80, {{"TERM", "dumb"}});
  EXPECT_THAT(dumb, HasSubstr("\nzep: 2 of 2 hosts done, 2 failed\n"));
  EXPECT_EQ(dumb.find('\r'), std::string::npos);
}

TEST_F(AtTerminalTest, HelpIsAlsoACommand) {
  EXPECT_EQ(fZep.Run({{"help"}}).fOutput, fZep.Run({{"--help"}}).fOutput);
  EXPECT_EQ(fZep.Run({{"help", "report"}}).fOutput, fZep.Run({{"report", "--help"}}).fOutput);
  EXPECT_EQ(fZep.Run({{"help", "media", "mount"}}).fOutput, fZep.Run({{"media", "mount", "--help"}}).fOutput);
  TRun const wrong = fZep.Run({{"help", "bogus"}});
  EXPECT_EQ(wrong.fStatus, 64);
  EXPECT_EQ(wrong.fErrors, "zep: unknown command; zep --help lists all commands\n");
}

}  // namespace
}  // namespace NQRVZEP20::zep
