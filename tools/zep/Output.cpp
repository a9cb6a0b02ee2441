#include "Output.h"

#include <unistd.h>

#include <cerrno>
#include <cstdio>
#include <iostream>
#include <system_error>

namespace NQRVZEP20::zep {

void WriteOutput(std::string const& text) {
  std::size_t written = 0;
  while (written < text.size()) {
    ssize_t const count = ::write(STDOUT_FILENO, text.data() + written, text.size() - written);
    if (count < 0 && errno == EINTR) continue;
    if (count < 0) throw std::system_error(errno, std::generic_category(), "standard output cannot be written");
    written += static_cast<std::size_t>(count);
  }
}

TOutputGuard::TOutputGuard() : fOutput(::dup(STDOUT_FILENO)) {
  if (fOutput >= 0) ::dup2(STDERR_FILENO, STDOUT_FILENO);
}

TOutputGuard::~TOutputGuard() {
  std::cout.flush();
  std::fflush(stdout);
  if (fOutput < 0) return;
  ::dup2(fOutput, STDOUT_FILENO);
  ::close(fOutput);
}

}  // namespace NQRVZEP20::zep
