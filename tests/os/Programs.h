// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <sys/wait.h>

#include <array>
#include <cstdio>
#include <memory>
#include <string>

namespace NQRVZEP20 {

struct TProgramRun {
  std::string fOutput;  // standard output, and standard error where the command joins them
  int fExitCode;        // -1: ended by a signal
};

// Runs a command of the shell.
inline TProgramRun RunProgram(std::string const& command) {
  std::unique_ptr<FILE, int (*)(FILE*)> pipe(::popen(command.c_str(), "r"), ::pclose);
  TProgramRun run;
  std::array<char, 4096> chunk;
  while (std::size_t const got = std::fread(chunk.data(), 1, chunk.size(), pipe.get())) run.fOutput.append(chunk.data(), got);
  int const status = ::pclose(pipe.release());
  run.fExitCode = WIFEXITED(status) ? WEXITSTATUS(status) : -1;
  return run;
}

}  // namespace NQRVZEP20
