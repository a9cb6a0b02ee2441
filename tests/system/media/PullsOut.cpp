// SPDX-License-Identifier: Apache-2.0

// A library to be preloaded. Immediately before the fsync whose number is ZEP_PULL_AT, counted from 1, it runs the shell command
// ZEP_PULL or raises the signal ZEP_RAISE.

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
