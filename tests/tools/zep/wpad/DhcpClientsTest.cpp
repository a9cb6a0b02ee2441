// SPDX-License-Identifier: Apache-2.0
#include "tools/zep/wpad/DhcpClients.h"

#include "tests/Support.h"

#include <gtest/gtest.h>

#include <cstdlib>
#include <filesystem>

namespace NQRVZEP20::zep {
namespace {

// Puts a program "ps" on PATH, which prints a line that starts with `beginning` and ends differently each time.
class TChangingLine {
public:
  explicit TChangingLine(std::string const& beginning) : fPath(std::getenv("PATH")) {
    std::string const program = fDirectory.Path("ps");
    WriteFile(program, "#!/bin/sh\necho >> \"$0.count\"\necho \"" + beginning + " x$(wc -l < \"$0.count\") dhclient\"\n");
    std::filesystem::permissions(program, std::filesystem::perms::owner_all);
    ::setenv("PATH", (fDirectory.Path() + ":" + fPath).c_str(), 1);
  }
  ~TChangingLine() { ::setenv("PATH", fPath.c_str(), 1); }

private:
  TTempDir fDirectory;
  std::string fPath;
};

TEST(DhcpClientsTest, OnlyAPlainProcessNumberIsAccepted) {
  for (std::string const number : {"0", "02", "0000001", "12345678", "4294967298"})
    EXPECT_NE(WhyNotToBeEnded({" " + number + " ? 00:00:00 dhclient"})
                  .find(" is wrong: " + number + " is not a process ID. Nothing was killed."),
              std::string::npos)
        << number;
  EXPECT_EQ(WhyNotToBeEnded({"dhclient without a number"}), "") << "a line without a number ends no process";
}

TEST(DhcpClientsTest, LinesAreComparedByTheirNumber) {
  TChangingLine const line("9999999");  // no process can have this number
  std::vector<std::string> const lines = DhcpClientLines();
  ASSERT_EQ(lines.size(), 1u);
  ASSERT_NE(lines, DhcpClientLines());
  EXPECT_NE(WhyNotToBeEnded(lines).find(" is wrong: process 9999999 does not exist. Nothing was killed."), std::string::npos);
}

}  // namespace
}  // namespace NQRVZEP20::zep
