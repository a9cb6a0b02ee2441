// SPDX-License-Identifier: Apache-2.0
#include "tools/zep/output/Output.h"

#include "tools/zep/processes/WriteWhole.h"
#include "tools/zep/secrets/Secrets.h"

#include <unistd.h>

#include <cerrno>
#include <cstdio>
#include <iostream>
#include <system_error>

namespace NQRVZEP20::zep {

namespace {

bool gHasWrittenOutput = false;

// Repeats what a signal interrupts: otherwise the document would go to standard error.
void Redirect(int from, int to) {
  while (::dup2(from, to) < 0 && (errno == EINTR || errno == EBUSY)) continue;
}

}  // namespace

void WriteOutput(std::string const& text) {
  gHasWrittenOutput = true;
  if (!WriteWhole(STDOUT_FILENO, text))
    throw std::system_error(errno, std::generic_category(), "standard output cannot be written");
}

void WriteMessage(std::string const& text) { WriteOutput(MessageWithoutSecrets(text)); }

bool HasWrittenOutput() { return gHasWrittenOutput; }

TOutputGuard::TOutputGuard() : fOutput(::dup(STDOUT_FILENO)) {
  if (fOutput) Redirect(STDERR_FILENO, STDOUT_FILENO);
}

TOutputGuard::~TOutputGuard() {
  std::cout.flush();
  std::fflush(stdout);
  if (fOutput) Redirect(fOutput.get(), STDOUT_FILENO);
}

}  // namespace NQRVZEP20::zep
