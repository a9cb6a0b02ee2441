// SPDX-License-Identifier: Apache-2.0
#include "TMachineCopy.h"

#include "RecordedMark.h"

#include <dlfcn.h>
#include <fcntl.h>
#include <sys/file.h>
#include <sys/stat.h>
#include <unistd.h>

#include <algorithm>
#include <cerrno>
#include <deque>
#include <filesystem>
#include <utility>

namespace NQRVZEP20 {

namespace {

namespace fs = std::filesystem;

constexpr int kMostLinks = 40;  // as the kernel
constexpr mode_t kWholeMode = 0400, kPartMode = 0600;

// The link of a process to its own directory: each process that reads has another one, so it is copied as a directory.
constexpr char const* kOwnProcess = "/proc/self";

std::string FileOf(void const* address) {
  Dl_info info = {};
  return ::dladdr(address, &info) != 0 && info.dli_fname != nullptr ? info.dli_fname : "";
}

std::deque<std::string> NamesOf(std::string const& path) {
  std::deque<std::string> names;
  for (fs::path const& part : fs::path(path).relative_path())
    if (!part.empty() && part != ".") names.push_back(part.string());
  return names;
}

// The target of a link below the root, relative to the directory of the link, which is not reached through links, and without
// the ".." beyond the root, which is its own parent. With it, the copy can be read without regard to its root.
std::string RelativeTarget(std::string const& link, std::string const& target) {
  auto const depth = std::count(link.begin(), link.end(), '/') - 1;
  bool const isAbsolute = !target.empty() && target.front() == '/';
  std::deque<std::string> names = NamesOf(target);
  auto const ups = std::find_if(names.begin(), names.end(), [](std::string const& name) { return name != ".."; }) - names.begin();
  if (!isAbsolute && ups <= depth) return target;
  names.erase(names.begin(), names.begin() + ups);
  for (auto level = depth; level > 0; --level) names.emplace_front("..");
  std::string relative = ".";
  for (std::string const& name : names) relative += "/" + name;
  return names.empty() ? relative : relative.substr(2);
}

std::string TargetOf(TFd const& link) {
  char target[4096];
  ssize_t const length = ::readlinkat(link.Get(), "", target, sizeof target);
  return {target, static_cast<std::size_t>(std::max<ssize_t>(length, 0))};
}

// Held while this process copies.
class TCopyLock {
public:
  explicit TCopyLock(std::string const& directory) : fDirectory(OpenBelow("", directory, O_RDONLY | O_DIRECTORY)) {
    ::flock(fDirectory.Get(), LOCK_EX);
  }

private:
  TFd fDirectory;  // its end unlocks
};

}  // namespace

TMachineCopy::TMachineCopy(std::string from, std::string to)
    : fFrom(std::move(from)), fTo(std::move(to)), fNote("/zep-plug-ins/" + fs::path(FileOf(&kOwnProcess)).filename().string()) {
  if (!OpenBelow("", fTo + fNote, O_PATH)) Write(fNote, "", kWholeMode);
}

void TMachineCopy::NoteLoss() const { ::chmod((fTo + fNote).c_str(), kPartMode); }

TMachineCopy::TPlace TMachineCopy::Look(std::string const& path) const {
  TFd const file = OpenBelow(fFrom, path.empty() ? "/" : path, O_PATH | O_NOFOLLOW);
  if (!file) return {path, {}, errno};
  return {path, StatusOf(file)};
}

// Follows each link itself, in order to copy it.
TMachineCopy::TPlace TMachineCopy::Walk(std::string const& path) const {
  TPlace place{"", {}, 0};
  int links = 0;
  for (std::deque<std::string> left = NamesOf(path); !left.empty();) {
    std::string const name = left.front();
    left.pop_front();
    if (name == "..") {
      place = Look(place.fPath.substr(0, place.fPath.rfind('/')));
      continue;
    }
    TPlace next = Look(place.fPath + "/" + name);
    if (next.fError == 0 && S_ISLNK(next.fStatus.st_mode) && next.fPath != kOwnProcess) {
      if (++links > kMostLinks) return {next.fPath, {}, ELOOP};
      std::string const target = TargetOf(OpenBelow(fFrom, next.fPath, O_PATH | O_NOFOLLOW));
      KeepLink(next.fPath, target);
      if (!target.empty() && target.front() == '/') place = {"", {}, 0};
      std::deque<std::string> const more = NamesOf(target);
      left.insert(left.begin(), more.begin(), more.end());
      continue;
    }
    if (next.fError != 0) {
      for (std::string const& rest : left) next.fPath += "/" + rest;
      return next;
    }
    Keep(next);
    place = std::move(next);
  }
  return place;
}

void TMachineCopy::Keep(TPlace const& place) const {
  if (S_ISDIR(place.fStatus.st_mode) || place.fPath == kOwnProcess)
    KeepDirectory(place.fPath);
  else if (!OpenBelow("", fTo + place.fPath, O_PATH | O_NOFOLLOW))
    Mark(place.fPath, S_ISREG(place.fStatus.st_mode) ? kListedMark : kSpecialMark);
}

void TMachineCopy::KeepDirectory(std::string const& path) const {
  std::error_code failure;
  fs::create_directories(fTo + path, failure);
  if (failure) NoteLoss();
}

void TMachineCopy::KeepLink(std::string const& path, std::string const& target) const {
  KeepDirectory(fs::path(path).parent_path());
  if (::symlink(RelativeTarget(path, target).c_str(), (fTo + path).c_str()) != 0 && errno != EEXIST) NoteLoss();
}

// Writes a file anew.
void TMachineCopy::Write(std::string const& path, std::string const& content, mode_t mode) const {
  std::string const file = fTo + path;
  KeepDirectory(fs::path(path).parent_path());
  ::unlink(file.c_str());
  TFd const made(::open(file.c_str(), O_WRONLY | O_CREAT | O_EXCL | O_CLOEXEC, kPartMode));
  bool const isWritten = made && ::write(made.Get(), content.data(), content.size()) == static_cast<ssize_t>(content.size());
  if (isWritten && ::fchmod(made.Get(), mode) == 0) return;
  ::unlink(file.c_str());
  NoteLoss();
}

// Writes a part of a file, and leaves those that it has.
void TMachineCopy::WritePart(std::string const& path, std::size_t offset, std::string const& content) const {
  if (IsMark(StatusOf(OpenBelow("", fTo + path, O_PATH)))) Write(path, "", kPartMode);
  TFd const part(::open((fTo + path).c_str(), O_WRONLY | O_CLOEXEC));
  ssize_t const written = ::pwrite(part.Get(), content.data(), content.size(), static_cast<off_t>(offset));
  if (written != static_cast<ssize_t>(content.size())) NoteLoss();
}

// Whether the file was copied to its end.
bool TMachineCopy::HasWhole(std::string const& path) const {
  struct stat const kept = StatusOf(OpenBelow("", fTo + path, O_PATH));
  return S_ISREG(kept.st_mode) && !IsMark(kept) && (kept.st_mode & 0777) == kWholeMode;
}

void TMachineCopy::Mark(std::string const& path, std::string const& mark) const { Write(path, mark, kMarkMode & 07777); }

void TMachineCopy::KeepBytes(std::string const& path, std::size_t offset, std::size_t length) const {
  TCopyLock const lock(fTo);
  TPlace const place = Walk(path);
  if (place.fError == ENOENT || place.fError == ENOTDIR) return;
  if (place.fError != 0) return Mark(place.fPath, MarkOf(TRefusal{place.fError, ::geteuid() == 0}));
  if (!S_ISREG(place.fStatus.st_mode) || HasWhole(place.fPath)) return;

  bool const isMark = !fFrom.empty() && IsMark(place.fStatus);  // of a recorded machine
  TFd const file = OpenBelow(fFrom, place.fPath, O_RDONLY);
  std::string content;
  bool const isRead = file && ReadAt(file, isMark ? 0 : offset, isMark ? kLongestMark : length, content);
  if (!isRead) return Mark(place.fPath, MarkOf(TRefusal{errno, ::geteuid() == 0}));
  if (isMark) return Mark(place.fPath, content);
  if (offset == 0 && content.size() < length) return Write(place.fPath, content, kWholeMode);
  WritePart(place.fPath, offset, content);
}

void TMachineCopy::KeepNames(std::string const& directory) const {
  TCopyLock const lock(fTo);
  TPlace const place = Walk(directory);
  if (place.fError != 0) return;
  for (std::string const& name : NamesIn(OpenBelow(fFrom, place.fPath + "/", O_RDONLY | O_DIRECTORY))) {
    TPlace const entry = Look(place.fPath + "/" + name);
    if (entry.fError == 0 && S_ISLNK(entry.fStatus.st_mode) && entry.fPath != kOwnProcess)
      KeepLink(entry.fPath, TargetOf(OpenBelow(fFrom, entry.fPath, O_PATH | O_NOFOLLOW)));
    else if (entry.fError == 0)
      Keep(entry);
  }
}

void TMachineCopy::KeepPlace(std::string const& path) const {
  TCopyLock const lock(fTo);
  Walk(path);
}

void TMachineCopy::KeepAnswer(std::string const& path, TFinding<std::string> const& answer) const {
  if (answer)
    Write(path, *answer, kWholeMode);
  else
    Mark(path, MarkOf(answer.Why()));
}

}  // namespace NQRVZEP20
