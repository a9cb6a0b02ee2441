// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <dirent.h>
#include <dlfcn.h>
#include <unistd.h>

#include <cerrno>
#include <cstdio>
#include <memory>
#include <string>
#include <utility>

namespace NQRVZEP20 {

// Owners of operating system resources. Each closes its resource when it goes out of scope, and can be moved but not copied.
// release() gives up ownership without closing.

struct TFileCloser {
  void operator()(std::FILE* file) const noexcept { std::fclose(file); }
};
using TUniqueFile = std::unique_ptr<std::FILE, TFileCloser>;

struct TDirCloser {
  void operator()(DIR* dir) const noexcept { ::closedir(dir); }
};
using TUniqueDir = std::unique_ptr<DIR, TDirCloser>;

struct TLibraryCloser {
  void operator()(void* library) const noexcept { ::dlclose(library); }
};
using TSharedLibrary = std::unique_ptr<void, TLibraryCloser>;

// The function `name` of a library; null when the library lacks it.
template <class TFunction>
TFunction* FunctionOf(void* library, char const* name) {
  return reinterpret_cast<TFunction*>(::dlsym(library, name));
}

// Why the preceding call of the dynamic linker failed; empty when it succeeded.
inline std::string LinkerReason() {
  char const* const reason = ::dlerror();
  return reason ? reason : "";
}

// A file descriptor; below 0 there is none. Closing keeps errno, so that the reason of a failure outlives the descriptor.
class TUniqueFd {
public:
  explicit TUniqueFd(int fd = -1) noexcept : fFd(fd) {}
  TUniqueFd(TUniqueFd&& other) noexcept : fFd(other.release()) {}
  TUniqueFd& operator=(TUniqueFd&& other) noexcept {
    reset(other.release());
    return *this;
  }
  ~TUniqueFd() { reset(); }

  int get() const noexcept { return fFd; }
  explicit operator bool() const noexcept { return fFd >= 0; }
  int release() noexcept { return std::exchange(fFd, -1); }
  void reset(int fd = -1) noexcept {
    int const error = errno;
    if (fFd >= 0) ::close(fFd);
    errno = error;
    fFd = fd;
  }

private:
  int fFd;  // -1: none
};

}  // namespace NQRVZEP20
