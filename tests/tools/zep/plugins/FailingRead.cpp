// SPDX-License-Identifier: Apache-2.0

// A library to be preloaded. Reading the file ZEP_TEST_FAILING_FILE fails from the byte ZEP_TEST_FAILING_BYTE on, counted from 0,
// as on a failing disk.

#include <dlfcn.h>
#include <limits.h>
#include <stdlib.h>
#include <unistd.h>

#include <algorithm>
#include <cerrno>
#include <string>

namespace {

bool IsTheFile(int descriptor) {
  char const* const name = ::getenv("ZEP_TEST_FAILING_FILE");
  char target[PATH_MAX] = "";
  std::string const link = "/proc/self/fd/" + std::to_string(descriptor);
  return name != nullptr && ::readlink(link.c_str(), target, sizeof target - 1) > 0 && std::string(target) == name;
}

}  // namespace

extern "C" __attribute__((visibility("default"))) ssize_t read(int descriptor, void* buffer, size_t size) {
  static auto const next = reinterpret_cast<ssize_t (*)(int, void*, size_t)>(::dlsym(RTLD_NEXT, "read"));
  if (IsTheFile(descriptor)) {
    off_t const left = ::atol(::getenv("ZEP_TEST_FAILING_BYTE")) - ::lseek(descriptor, 0, SEEK_CUR);
    if (left <= 0) {
      errno = EIO;
      return -1;
    }
    size = std::min(size, static_cast<size_t>(left));
  }
  return next(descriptor, buffer, size);
}
