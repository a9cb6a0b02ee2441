// SPDX-License-Identifier: Apache-2.0
#include "RootedFiles.h"

#include <dirent.h>
#include <fcntl.h>
#include <linux/openat2.h>
#include <sys/syscall.h>
#include <unistd.h>

#include <algorithm>
#include <cerrno>
#include <cstdint>
#include <memory>
#include <utility>

namespace NQRVZEP20 {

namespace {

TFd OpenResolved(std::string const& root, std::string const& path, int flags, std::uint64_t resolve) {
  TFd const directory(::open(root.c_str(), O_PATH | O_DIRECTORY | O_CLOEXEC));
  if (!directory) return TFd(-1);
  open_how how = {};
  how.flags = static_cast<unsigned>(flags);
  how.resolve = resolve;
  // The kernel gives up at ".." with EAGAIN if anything on the machine was renamed or mounted meanwhile.
  constexpr int attempts = 10000;
  for (int attempt = 1;; ++attempt) {
    int const fd = static_cast<int>(::syscall(SYS_openat2, directory.Get(), path.c_str(), &how, sizeof how));
    if (fd >= 0 || errno != EAGAIN || attempt == attempts) return TFd(fd);
  }
}

}  // namespace

TFd::TFd(TFd&& other) noexcept : fFd(other.Release()) {}

TFd::~TFd() {
  if (fFd >= 0) ::close(fFd);
}

int TFd::Release() { return std::exchange(fFd, -1); }

// O_NONBLOCK: opening a FIFO must not wait for its writer.
TFd OpenBelow(std::string const& root, std::string const& path, int flags) {
  flags |= O_CLOEXEC;
  if ((flags & O_PATH) == 0) flags |= O_NONBLOCK | O_NOCTTY;
  if (root.empty()) return TFd(::open(path.c_str(), flags));
  return OpenResolved(root, path, flags, RESOLVE_IN_ROOT);
}

bool LeadsOut(std::string const& root, std::string const& path) {
  if (OpenResolved(root, path, O_PATH | O_CLOEXEC, RESOLVE_BENEATH)) return false;
  for (int const isNowhere : {ENOENT, ENOTDIR, ELOOP, ENAMETOOLONG})
    if (errno == isNowhere) return false;
  return true;
}

struct stat StatusOf(TFd const& file) {
  struct stat status = {};
  if (::fstat(file.Get(), &status) != 0) status = {};
  return status;
}

bool ReadAt(TFd const& file, std::size_t offset, std::size_t length, std::string& content) {
  if (offset != 0 && ::lseek(file.Get(), static_cast<off_t>(offset), SEEK_SET) < 0) return false;
  char buffer[4096];
  while (content.size() < length) {
    ssize_t const count = ::read(file.Get(), buffer, std::min(sizeof buffer, length - content.size()));
    if (count == 0) return true;
    if (count > 0)
      content.append(buffer, static_cast<std::size_t>(count));
    else if (errno != EINTR)
      return false;
  }
  return true;
}

std::vector<std::string> NamesIn(TFd directory) {
  if (!directory) return {};
  std::unique_ptr<DIR, int (*)(DIR*)> const entries(::fdopendir(directory.Get()), ::closedir);
  if (!entries) return {};
  directory.Release();  // owned by `entries` from here on
  std::vector<std::string> names;
  while (dirent const* const entry = ::readdir(entries.get())) {
    std::string name = entry->d_name;
    if (name != "." && name != "..") names.push_back(std::move(name));
  }
  return names;
}

}  // namespace NQRVZEP20
