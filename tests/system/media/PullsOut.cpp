// SPDX-License-Identifier: Apache-2.0

// To be preloaded: runs the shell command ZEP_PULL just before the ZEP_PULL_ATth fsync of the process.

#include <dlfcn.h>

#include <cstdlib>

namespace {
int gCalls = 0;
}

extern "C" __attribute__((visibility("default"))) int fsync(int fd) {
  char const* const command = std::getenv("ZEP_PULL");
  char const* const at = std::getenv("ZEP_PULL_AT");
  if (command != nullptr && at != nullptr && ++gCalls == std::atoi(at) && std::system(command) != 0) std::abort();
  return reinterpret_cast<int (*)(int)>(::dlsym(RTLD_NEXT, "fsync"))(fd);
}
