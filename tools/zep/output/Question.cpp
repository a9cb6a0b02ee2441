// SPDX-License-Identifier: Apache-2.0
#include "tools/zep/output/Question.h"

#include "tools/zep/processes/Interrupts.h"

#include <unistd.h>

#include <iostream>

namespace NQRVZEP20::zep {

namespace {

std::string LineFromTerminal() {
  std::string line;
  for (char byte = 0; WaitForInput(STDIN_FILENO) && ::read(STDIN_FILENO, &byte, 1) == 1 && byte != '\n';) line += byte;
  return line;
}

}  // namespace

bool IsConfirmed(std::string const& question) {
  if (::isatty(STDIN_FILENO) == 0 || ::isatty(STDERR_FILENO) == 0) return true;
  std::cerr << question << " [y/N] " << std::flush;
  std::string const answer = LineFromTerminal();
  return answer == "y" || answer == "Y" || answer == "yes";
}

}  // namespace NQRVZEP20::zep
