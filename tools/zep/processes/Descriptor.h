// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <unistd.h>

#include <cerrno>
#include <string_view>
#include <utility>

namespace NQRVZEP20::zep {

// Owns a file descriptor, and closes it at the end; below 0 there is none. Moving leaves the other one with none. Closing keeps
// errno, so that the reason of a failure outlives it.
class TDescriptor {
public:
  TDescriptor() = default;
  explicit TDescriptor(int fd) : fFd(fd) {}
  ~TDescriptor() {
    int const error = errno;
    if (fFd >= 0) ::close(fFd);
    errno = error;
  }
  TDescriptor(TDescriptor&& other) noexcept : fFd(std::exchange(other.fFd, -1)) {}
  TDescriptor& operator=(TDescriptor other) noexcept {
    std::swap(fFd, other.fFd);
    return *this;
  }

  int Get() const { return fFd; }
  explicit operator bool() const { return fFd >= 0; }

private:
  int fFd = -1;
};

// Writes the whole text, going on after a signal. False, with the reason in errno, when it cannot be written to its end.
bool WriteWhole(int fd, std::string_view text);

}  // namespace NQRVZEP20::zep
