// SPDX-License-Identifier: Apache-2.0
#pragma once

// Files below a root directory, for TMachineFiles and TMachineCopy.

#include <sys/stat.h>

#include <cstddef>
#include <string>
#include <vector>

namespace NQRVZEP20 {

// Owns a file descriptor.
class TFd {
public:
  explicit TFd(int fd) : fFd(fd) {}
  TFd(TFd&& other) noexcept;
  TFd& operator=(TFd&&) = delete;
  ~TFd();

  explicit operator bool() const { return fFd >= 0; }
  int Get() const { return fFd; }
  int Release();

private:
  int fFd;
};

// Opens a path below the root, or with an empty root the path itself, and leaves the reason of a failure in errno. Links are
// followed within the root. Opening never waits for the writer of a FIFO.
TFd OpenBelow(std::string const& root, std::string const& path, int flags);

// Whether a link on the way to the path leads out of the root, or cannot be followed within it for another reason than that its
// target does not exist. The path is relative to the root.
bool LeadsOut(std::string const& root, std::string const& path);

// All zero if the descriptor is not open.
struct stat StatusOf(TFd const& file);

// Reads up to `length` bytes from `offset`, or to the end of the file. Returns false and leaves the reason in errno when reading
// fails.
bool ReadAt(TFd const& file, std::size_t offset, std::size_t length, std::string& content);

// The names in an open directory, without "." and "..", in any order; none if it cannot be read.
std::vector<std::string> NamesIn(TFd directory);

}  // namespace NQRVZEP20
