// SPDX-License-Identifier: Apache-2.0
#include "TMachineFiles.h"

#include "RecordedMark.h"
#include "RootedFiles.h"
#include "TMachineCopy.h"

#include <fcntl.h>
#include <sys/stat.h>
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

TMissing WhyUnreadable(std::string const& path, int error) { return WhyRefused(path, {error, ::geteuid() == 0}); }

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
  char const* const from = std::getenv("ZEP_RECORD_FROM");
  TMachineFiles files(named != nullptr ? named : "/");
  if (from == nullptr || files.fRoot.empty()) return files;
  files.fSource = std::make_shared<TMachineFiles>(from);
  files.fCopy = std::make_shared<TMachineCopy>(files.fSource->fRoot, files.fRoot);
  return files;
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
  if (fCopy) fCopy->KeepBytes(path, offset, length);
  TFd const file = OpenBelow(fRoot, path, O_RDONLY);
  if (!file) return WhyUnreadable(path, errno);
  struct stat const status = StatusOf(file);
  if (!S_ISREG(status.st_mode)) return TMissing{kMissingUnreadable, path + " is not a regular file"};
  bool const isMark = !fRoot.empty() && IsMark(status);
  std::string content;
  if (!ReadAt(file, isMark ? 0 : offset, isMark ? kLongestMark : length, content)) return WhyUnreadable(path, errno);
  if (isMark) return WhyMarked(path, content);
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
  if (fCopy) fCopy->KeepNames(directory);
  std::vector<std::string> names = NamesIn(OpenBelow(fRoot, directory, O_RDONLY | O_DIRECTORY));
  std::sort(names.begin(), names.end(),
            [](std::string const& a, std::string const& b) { return ::strverscmp(a.c_str(), b.c_str()) < 0; });
  return names;
}

bool TMachineFiles::Exists(std::string const& path) const {
  if (fCopy) fCopy->KeepPlace(path);
  return static_cast<bool>(OpenBelow(fRoot, path, O_PATH));
}

TFinding<std::string> TMachineFiles::RealPath(std::string const& path) const {
  if (fCopy) fCopy->KeepPlace(path);
  if (fRoot.empty()) {
    std::unique_ptr<char, void (*)(void*)> const real(::realpath(path.c_str(), nullptr), std::free);
    return real ? TFinding<std::string>(real.get()) : WhyUnreadable(path, errno);
  }

  // The kernel knows the path of an open file; the C library's realpath would follow absolute links out of the root.
  TFd const root = OpenBelow("", fRoot + "/", O_PATH);
  TFd const file = OpenBelow(fRoot, path, O_PATH);
  if (!file) return WhyUnreadable(path, errno);
  std::string const above = PathOf(root), found = PathOf(file);
  return found.substr(std::min(above.size(), found.size()));
}

TFinding<std::string> TMachineFiles::RealName(std::string const& path) const {
  return RealPath(path).Then([](std::string const& real) { return real.substr(real.rfind('/') + 1); });
}

bool TMachineFiles::IsThisMachine() const { return fSource ? fSource->IsThisMachine() : fRoot.empty(); }

std::string TMachineFiles::Outside(std::string const& path) const {
  if (fCopy) fCopy->KeepBytes(path, 0, kAnswerLimit);
  return fRoot + path;
}

TFinding<std::string> TMachineFiles::Answer(std::string const& name, std::function<TFinding<std::string>()> const& ask) const {
  if (fCopy) {
    TFinding<std::string> answer = fSource->Answer(name, ask);
    fCopy->KeepAnswer(kAnswers + name, answer);
    return answer;
  }
  if (!IsThisMachine()) return Content(kAnswers + name, kAnswerLimit);
  TFinding<std::string> answer = ask();
  char const* const recording = std::getenv("ZEP_RECORD_ANSWERS");
  if (recording != nullptr && answer) Record(recording + (kAnswers + name), *answer);
  return answer;
}

bool TMachineFiles::HasAnswer(std::string const& name) const {
  return fSource ? fSource->HasAnswer(name) : Exists(kAnswers + name);
}

bool IsSampleDescribed() { return std::getenv("ZEP_SAMPLE") != nullptr; }

}  // namespace NQRVZEP20
