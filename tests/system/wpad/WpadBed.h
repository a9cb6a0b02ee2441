// SPDX-License-Identifier: Apache-2.0
#pragma once

// Commands with a real DHCP server, in namespaces of their own (run-in-netns.sh).

#include "tests/Support.h"

#include <sys/wait.h>
#include <unistd.h>

#include <cstdlib>

namespace NQRVZEP20 {

using TLines = std::vector<std::string>;

inline TLines LinesOf(std::string const& text) {
  TLines lines;
  std::istringstream stream(text);
  for (std::string line; std::getline(stream, line);) lines.push_back(line);
  return lines;
}

inline bool IsThere(std::string const& program) {
  return std::system(("PATH=$PATH:/usr/sbin:/sbin command -v " + program + " > /dev/null").c_str()) == 0;
}

class TWpadBed : public testing::Test {
protected:
  void SetUp() override {
    NEEDS(::geteuid() == 0, "only root makes networks");
    for (auto const& [program, package] : {std::pair{"dhcpd", "isc-dhcp-server"},
                                           {"ip", "iproute2"},
                                           {"python3", "python3"},
                                           {"ps", "procps"},
                                           {"ifconfig", "net-tools"},
                                           {"busybox", "busybox"},
                                           {"dnsmasq", "dnsmasq-base"}})
      NEEDS(IsThere(program), std::string("no ") + program + " (package " + package + ")");
  }

  // Runs the shell command within the namespaces; returns its output and exit status. `settings` are variables for
  // run-in-netns.sh and for the command, such as "WPAD_SERVER=none ".
  struct TRun {
    int fStatus;
    std::string fOutput, fErrors;
  };
  TRun RunInside(std::string const& settings, std::string const& command) {
    WriteFile(fDir.Path("command"), command);
    std::string const call = "PATH=$PATH:/usr/sbin:/sbin PROBE=" WPAD_PROBE " ZEP=" TEST_BIN_DIR "/zep HURRY=" WPAD_HURRY " " +
                             settings + " timeout 60 " + SourcePath("tests/system/wpad/run-in-netns.sh") + " bash " +
                             fDir.Path("command") + " < /dev/null > " + fDir.Path("out") + " 2> " + fDir.Path("err");
    int const status = std::system(call.c_str());
    return {WIFEXITED(status) ? WEXITSTATUS(status) : -1, ReadFile(fDir.Path("out")), ReadFile(fDir.Path("err"))};
  }

  // The output of a command that must succeed.
  std::string Inside(std::string const& settings, std::string const& command) {
    TRun const run = RunInside(settings, command);
    EXPECT_EQ(run.fStatus, 0) << run.fErrors;
    return run.fOutput;
  }

  // A file for the server "bytes".
  std::string ReplyFile(std::string const& hexadecimal) {
    WriteFile(fDir.Path("reply"), hexadecimal);
    return "WPAD_SERVER=bytes WPAD_REPLY=" + fDir.Path("reply") + " ";
  }

  TTempDir fDir;
};

}  // namespace NQRVZEP20
