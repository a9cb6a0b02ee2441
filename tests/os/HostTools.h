// SPDX-License-Identifier: Apache-2.0
#pragma once

// Helpers that the tests of the host services share.

#include "TOSSpecific.h"
#include "core/Handles.h"
#include "tests/LogOf.h"
#include "tests/Support.h"

#include <grp.h>
#include <sched.h>
#include <sys/mount.h>
#include <sys/stat.h>
#include <sys/wait.h>
#include <unistd.h>

#include <algorithm>
#include <iterator>

namespace NQRVZEP20 {

// The path of a program of tests/os/children.
inline std::string Child(std::string const& name) { return std::string(ZEP_CHILDREN_DIR) + "/" + name; }

// Replaces standard input by a descriptor, and restores it at the end.
class TStandardInput {
public:
  explicit TStandardInput(int fd) : fOld(::dup(0)) { ::dup2(fd, 0); }
  ~TStandardInput() { ::dup2(fOld.get(), 0); }
  TStandardInput(TStandardInput const&) = delete;
  TStandardInput& operator=(TStandardInput const&) = delete;

private:
  TUniqueFd fOld;
};

inline mode_t ModeOf(std::string const& path) {
  struct stat status {};
  ::stat(path.c_str(), &status);
  return status.st_mode & 07777;
}

class TUmask {
public:
  explicit TUmask(mode_t mask) : fOld(::umask(mask)) {}
  ~TUmask() { ::umask(fOld); }

private:
  mode_t fOld;
};

inline std::string TextOf(std::size_t size) {
  std::string text(size, ' ');
  for (std::size_t i = 0; i < size; ++i) text[i] = static_cast<char>(i * 31 + i / 256);
  return text;
}

// Changes the working directory, and restores it at the end.
class TWorkingDirectory {
public:
  explicit TWorkingDirectory(std::string const& path) : fOld(std::filesystem::current_path()) {
    std::filesystem::current_path(path);
  }
  ~TWorkingDirectory() { std::filesystem::current_path(fOld); }
  TWorkingDirectory(TWorkingDirectory const&) = delete;
  TWorkingDirectory& operator=(TWorkingDirectory const&) = delete;

private:
  std::filesystem::path fOld;
};

inline int OpenDescriptors() {
  using TEntries = std::filesystem::directory_iterator;
  return static_cast<int>(std::distance(TEntries("/proc/self/fd"), TEntries()));
}

// Whether this process has a child, running or ended and not waited for.
inline bool HasChildren() {
  siginfo_t info;
  return ::waitid(P_ALL, 0, &info, WEXITED | WNOHANG | WNOWAIT) == 0;
}

// Returns the text that the function returns in a child process. The child has its own memory, user and mounts, so its changes
// do not affect this process. An exception becomes a text as well; a child that dies, or fails an expectation, is reported.
template <class TFunction>
std::string InChild(TFunction function) {
  int ends[2];
  if (::pipe(ends) != 0) return "no pipe";
  pid_t const child = ::fork();
  if (child == 0) {
    std::string result;
    try {
      result = function();
    } catch (std::exception const& thrown) {
      result = std::string("threw ") + thrown.what();
    }
    if (testing::Test::HasFailure()) result += " (with failures)";
    bool const arrived = ::write(ends[1], result.data(), result.size()) == static_cast<ssize_t>(result.size());
    ::_exit(arrived ? 0 : 1);
  }
  ::close(ends[1]);
  std::string result;
  char chunk[4096];
  for (ssize_t got; (got = ::read(ends[0], chunk, sizeof chunk)) > 0;) result.append(chunk, static_cast<std::size_t>(got));
  ::close(ends[0]);
  int status = 0;
  if (child < 0 || ::waitpid(child, &status, 0) != child || status != 0) return "the child died";
  return result;
}

// For use in a child: gives up root's privileges, if there are any. False when it cannot.
inline bool BecomeUnprivileged() {
  constexpr int kNobody = 65534;
  return ::geteuid() != 0 || (::setgroups(0, nullptr) == 0 && ::setgid(kNobody) == 0 && ::setuid(kNobody) == 0);
}

// For use in a child: mounts a file system of memory, which only this child sees. False when it may not.
inline bool MountTmpfs(std::string const& path, std::string const& options) {
  return ::unshare(CLONE_NEWNS) == 0 && ::mount(nullptr, "/", nullptr, MS_REC | MS_PRIVATE, nullptr) == 0 &&
         ::mount("none", path.c_str(), "tmpfs", 0, options.c_str()) == 0;
}

// Whether a child may mount file systems.
inline bool MayMount() {
  TTempDir const dir;
  return InChild([&] { return MountTmpfs(dir.Path(), "") ? "yes" : "no"; }) == "yes";
}

// Changes into nested directories of 100 characters each, and then into one that gives the path the requested length.
inline void GoDownTo(std::size_t length) {
  std::size_t now = std::filesystem::current_path().string().size();
  while (now < length) {
    std::size_t const step = length - now > 202 ? 100 : length - now > 102 ? 50 : length - now - 1;
    std::string const name(step, 'd');
    if (::mkdir(name.c_str(), 0777) != 0 || ::chdir(name.c_str()) != 0) throw std::runtime_error("cannot go down");
    now += step + 1;
  }
}

}  // namespace NQRVZEP20
