// SPDX-License-Identifier: Apache-2.0

// To be preloaded: just before the ZEP_PULL_ATth fsync of the process, runs the shell command ZEP_PULL or raises the signal
// ZEP_RAISE.

#include <dlfcn.h>
#include <signal.h>

#include <cstdlib>

namespace {
int gCalls = 0;
}

extern "C" __attribute__((visibility("default"))) int fsync(int fd) {
  char const* const command = std::getenv("ZEP_PULL");
  char const* const signal = std::getenv("ZEP_RAISE");
  char const* const at = std::getenv("ZEP_PULL_AT");
  if (at != nullptr && ++gCalls == std::atoi(at)) {
    if (command != nullptr && std::system(command) != 0) std::abort();
    if (signal != nullptr) ::raise(std::atoi(signal));
  }
  return reinterpret_cast<int (*)(int)>(::dlsym(RTLD_NEXT, "fsync"))(fd);
}
