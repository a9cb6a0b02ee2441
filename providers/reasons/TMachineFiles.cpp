// SPDX-License-Identifier: Apache-2.0
#include "TMachineFiles.h"

#include <dirent.h>
#include <fcntl.h>
#include <linux/openat2.h>
#include <sys/stat.h>
#include <sys/syscall.h>
#include <unistd.h>

#include <algorithm>
#include <cerrno>
#include <cstdlib>
#include <cstring>
#include <filesystem>
#include <fstream>
#include <memory>
#include <utility>

namespace NQRVZEP20 {

namespace {

std::string const kAnswers = "/zep-answers/";
constexpr std::size_t kAnswerLimit = std::size_t(16) << 20;

class TFd {
public:
  explicit TFd(int fd) : fFd(fd) {}
  TFd(TFd&& other) noexcept : fFd(std::exchange(other.fFd, -1)) {}
  TFd& operator=(TFd&&) = delete;
  ~TFd() {
    if (fFd >= 0) ::close(fFd);
  }

  explicit operator bool() const { return fFd >= 0; }
  int Get() const { return fFd; }
  int Release() { return std::exchange(fFd, -1); }

private:
  int fFd;
};

// Opens a path below the root and leaves the reason of a failure in errno. O_NONBLOCK: opening a FIFO must not wait for its
// writer.
TFd OpenBelow(std::string const& root, std::string const& path, int flags) {
  flags |= O_CLOEXEC;
  if ((flags & O_PATH) == 0) flags |= O_NONBLOCK | O_NOCTTY;
  if (root.empty()) return TFd(::open(path.c_str(), flags));
  TFd const directory(::open(root.c_str(), O_PATH | O_DIRECTORY | O_CLOEXEC));
  if (!directory) return TFd(-1);
  open_how how = {};
  how.flags = static_cast<unsigned>(flags);
  how.resolve = RESOLVE_IN_ROOT;
  // The kernel gives up at ".." with EAGAIN if anything on the machine was renamed or mounted meanwhile.
  constexpr int attempts = 10000;
  for (int attempt = 1;; ++attempt) {
    int const fd = static_cast<int>(::syscall(SYS_openat2, directory.Get(), path.c_str(), &how, sizeof how));
    if (fd >= 0 || errno != EAGAIN || attempt == attempts) return TFd(fd);
  }
}

TMissing WhyUnreadable(std::string const& path, int error) {
  if (error == ENOENT || error == ENOTDIR) return {kMissingNotGiven, path + " does not exist"};
  if ((error == EACCES || error == EPERM) && ::geteuid() != 0) return {kMissingNeedsRoot, "only root may read " + path};
  return {kMissingUnreadable, path + " cannot be read: " + std::strerror(error)};
}

bool IsRegularFile(int fd) {
  struct stat status;
  return ::fstat(fd, &status) == 0 && S_ISREG(status.st_mode);
}

// Reads up to `limit` bytes, or to the end of the file. Returns false and leaves the reason in errno when reading fails.
bool ReadUpTo(int fd, std::size_t limit, std::string& content) {
  char buffer[4096];
  while (content.size() < limit) {
    ssize_t const count = ::read(fd, buffer, std::min(sizeof buffer, limit - content.size()));
    if (count == 0) return true;
    if (count > 0)
      content.append(buffer, static_cast<std::size_t>(count));
    else if (errno != EINTR)
      return false;
  }
  return true;
}

// The path of an open file, as the kernel knows it; empty without /proc.
std::string PathOf(TFd const& file) {
  char path[4096];
  ssize_t const length = ::readlink(("/proc/self/fd/" + std::to_string(file.Get())).c_str(), path, sizeof path);
  return {path, static_cast<std::size_t>(std::max<ssize_t>(length, 0))};
}

bool IsBlank(char c) { return c == ' ' || c == '\t' || c == '\r' || c == '\0'; }

std::string WithoutOuterBlanks(std::string const& text) {
  auto const first = std::find_if_not(text.begin(), text.end(), IsBlank);
  return {first, std::find_if_not(text.rbegin(), std::make_reverse_iterator(first), IsBlank).base()};
}

// A recording that cannot be written is incomplete, which its reader notices; the answer itself is not affected.
void Record(std::string const& path, std::string const& answer) {
  std::error_code ignored;
  std::filesystem::create_directories(std::filesystem::path(path).parent_path(), ignored);
  std::ofstream(path, std::ios::binary) << answer;
}

}  // namespace

TMachineFiles TMachineFiles::OfThisProcess() {
  char const* const named = std::getenv("ZEP_ROOT");
  return TMachineFiles(named != nullptr ? named : "/");
}

TMachineFiles::TMachineFiles(std::string root) : fRoot(std::move(root)) {
  while (!fRoot.empty() && fRoot.back() == '/') fRoot.pop_back();
}

TFinding<std::string> TMachineFiles::Content(std::string const& path, std::size_t limit) const {
  return Bytes(path, 0, limit + 1).Then([&](std::string const& content) -> TFinding<std::string> {
    if (content.size() <= limit) return content;
    return TMissing{kMissingUnreadable, path + " is longer than " + std::to_string(limit) + " bytes"};
  });
}

TFinding<std::string> TMachineFiles::Bytes(std::string const& path, std::size_t offset, std::size_t length) const {
  TFd const file = OpenBelow(fRoot, path, O_RDONLY);
  if (!file) return WhyUnreadable(path, errno);
  if (!IsRegularFile(file.Get())) return TMissing{kMissingUnreadable, path + " is not a regular file"};
  if (offset != 0 && ::lseek(file.Get(), static_cast<off_t>(offset), SEEK_SET) < 0) return WhyUnreadable(path, errno);
  std::string content;
  if (!ReadUpTo(file.Get(), length, content)) return WhyUnreadable(path, errno);
  return content;
}

TFinding<std::string> TMachineFiles::Line(std::string const& path) const {
  return Content(path).Then([&](std::string const& content) -> TFinding<std::string> {
    std::string line = WithoutOuterBlanks(content.substr(0, content.find('\n')));
    if (line.empty()) return TMissing{kMissingNotGiven, path + " is empty"};
    return line;
  });
}

std::vector<std::string> TMachineFiles::Names(std::string const& directory) const {
  TFd fd = OpenBelow(fRoot, directory, O_RDONLY | O_DIRECTORY);
  if (!fd) return {};
  std::unique_ptr<DIR, int (*)(DIR*)> const entries(::fdopendir(fd.Get()), ::closedir);
  if (!entries) return {};
  fd.Release();  // owned by `entries` from here on
  std::vector<std::string> names;
  while (dirent const* const entry = ::readdir(entries.get())) names.emplace_back(entry->d_name);
  names.erase(std::remove_if(names.begin(), names.end(), [](std::string const& name) { return name == "." || name == ".."; }),
              names.end());
  std::sort(names.begin(), names.end(),
            [](std::string const& a, std::string const& b) { return ::strverscmp(a.c_str(), b.c_str()) < 0; });
  return names;
}

bool TMachineFiles::Exists(std::string const& path) const { return static_cast<bool>(OpenBelow(fRoot, path, O_PATH)); }

TFinding<std::string> TMachineFiles::RealPath(std::string const& path) const {
  if (IsThisMachine()) {
    std::unique_ptr<char, void (*)(void*)> const real(::realpath(path.c_str(), nullptr), std::free);
    return real ? TFinding<std::string>(real.get()) : WhyUnreadable(path, errno);
  }

  // The kernel knows the path of an open file; the C library's realpath would follow absolute links out of the root.
  TFd const root = OpenBelow("", Outside("/"), O_PATH);
  TFd const file = OpenBelow(fRoot, path, O_PATH);
  if (!file) return WhyUnreadable(path, errno);
  std::string const above = PathOf(root), found = PathOf(file);
  return found.substr(std::min(above.size(), found.size()));
}

TFinding<std::string> TMachineFiles::RealName(std::string const& path) const {
  return RealPath(path).Then([](std::string const& real) { return real.substr(real.rfind('/') + 1); });
}

TFinding<std::string> TMachineFiles::Answer(std::string const& name, std::function<TFinding<std::string>()> const& ask) const {
  if (!IsThisMachine()) return Content(kAnswers + name, kAnswerLimit);
  TFinding<std::string> answer = ask();
  char const* const recording = std::getenv("ZEP_RECORD_ANSWERS");
  if (recording != nullptr && answer) Record(recording + (kAnswers + name), *answer);
  return answer;
}

bool IsSampleDescribed() { return std::getenv("ZEP_SAMPLE") != nullptr; }

}  // namespace NQRVZEP20
