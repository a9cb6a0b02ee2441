// SPDX-License-Identifier: Apache-2.0

// A library to be preloaded, for a failing disk. Reading the file ZEP_TEST_FAILING_FILE fails from the byte ZEP_TEST_FAILING_BYTE
// on, counted from 0, and so does fsync of the file ZEP_TEST_FAILING_SYNC.

#include <dlfcn.h>
#include <limits.h>
#include <stdlib.h>
#include <unistd.h>

#include <algorithm>
#include <cerrno>
#include <string>

namespace {

// Whether the descriptor is that of the file that the environment variable names.
bool IsTheFile(int descriptor, char const* variable) {
  char const* const name = ::getenv(variable);
  char target[PATH_MAX] = "";
  std::string const link = "/proc/self/fd/" + std::to_string(descriptor);
  return name != nullptr && ::readlink(link.c_str(), target, sizeof target - 1) > 0 && std::string(target) == name;
}

}  // namespace

extern "C" __attribute__((visibility("default"))) ssize_t read(int descriptor, void* buffer, size_t size) {
  static auto const next = reinterpret_cast<ssize_t (*)(int, void*, size_t)>(::dlsym(RTLD_NEXT, "read"));
  if (IsTheFile(descriptor, "ZEP_TEST_FAILING_FILE")) {
    off_t const left = ::atol(::getenv("ZEP_TEST_FAILING_BYTE")) - ::lseek(descriptor, 0, SEEK_CUR);
    if (left <= 0) {
      errno = EIO;
      return -1;
    }
    size = std::min(size, static_cast<size_t>(left));
  }
  return next(descriptor, buffer, size);
}

extern "C" __attribute__((visibility("default"))) int fsync(int descriptor) {
  static auto const next = reinterpret_cast<int (*)(int)>(::dlsym(RTLD_NEXT, "fsync"));
  if (!IsTheFile(descriptor, "ZEP_TEST_FAILING_SYNC")) return next(descriptor);
  errno = EIO;
  return -1;
}
