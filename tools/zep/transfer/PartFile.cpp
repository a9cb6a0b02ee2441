// SPDX-License-Identifier: Apache-2.0
#include "tools/zep/transfer/PartFile.h"

#include "core/Handles.h"
#include "tools/zep/output/Text.h"
#include "tools/zep/transfer/Download.h"
#include "tools/zep/transfer/LocalFile.h"

#include <fcntl.h>
#include <linux/fs.h>
#include <sys/stat.h>
#include <unistd.h>

#include <cerrno>
#include <cstdint>
#include <cstdio>
#include <filesystem>
#include <system_error>

namespace NQRVZEP20::zep {

namespace {

namespace fs = std::filesystem;

bool MakeEmptyFile(std::string const& path) {
  TUniqueFd const file(::open(path.c_str(), O_WRONLY | O_CREAT | O_EXCL | O_CLOEXEC, kModeOfPart));
  return static_cast<bool>(file);
}

// Returns whether it succeeded. Some file systems do not support a renaming that never replaces a file (EINVAL).
bool Rename(std::string const& from, std::string const& to, bool overwrites) {
  if (overwrites) return std::rename(from.c_str(), to.c_str()) == 0;
  if (::renameat2(AT_FDCWD, from.c_str(), AT_FDCWD, to.c_str(), RENAME_NOREPLACE) == 0) return true;
  if (errno != EINVAL) return false;
  return !fs::exists(to) && std::rename(from.c_str(), to.c_str()) == 0;
}

void SetMode(std::string const& path, mode_t mode) {
  TUniqueFd const file(::open(path.c_str(), O_RDONLY | O_NOFOLLOW | O_CLOEXEC));
  if (file) ::fchmod(file.get(), mode);
}

mode_t ModeOfNewFile() {
  mode_t const mask = ::umask(0);
  ::umask(mask);
  return 0666 & ~mask;
}

// Returns whether the file has the group now.
bool SetGroup(int file, gid_t group) {
  struct stat status {};
  bool const hasGroup = ::fstat(file, &status) == 0 && status.st_gid == group;
  return hasGroup || ::fchown(file, static_cast<uid_t>(-1), group) == 0;
}

// The mode for a file whose group could not be kept. The new group gets no permissions. The members of the former group are now
// among the others, so others get no permission that the former group did not have.
mode_t WithoutGroup(mode_t mode) { return (mode & 0700) | (mode & (mode >> 3) & 07); }

// Gives the part the group and the mode of the file that it replaces, or the mode that the umask allows for a new file. Changes
// nothing on a file system without groups and modes.
void SetAccess(std::string const& part, std::string const& file) {
  struct stat replaced {};
  if (::stat(file.c_str(), &replaced) != 0) return SetMode(part, ModeOfNewFile());
  TUniqueFd const opened(::open(part.c_str(), O_RDONLY | O_NOFOLLOW | O_CLOEXEC));
  if (!opened) return;
  mode_t const mode = replaced.st_mode & 0777;
  ::fchmod(opened.get(), SetGroup(opened.get(), replaced.st_gid) ? mode : WithoutGroup(mode));
}

}  // namespace

bool IsRegularFile(std::string const& file) {
  struct stat status {};
  return ::lstat(file.c_str(), &status) == 0 && S_ISREG(status.st_mode);
}

std::string WhyNoPart(std::string const& part) {
  struct stat status {};
  bool const isThere = ::lstat(part.c_str(), &status) == 0;
  if (isThere && !S_ISREG(status.st_mode)) return Printable(part) + " is not a regular file";
  if (isThere) return TUniqueFd(::open(part.c_str(), O_WRONLY | O_NOFOLLOW | O_CLOEXEC)) ? "" : ReasonOf(errno);
  if (!MakeEmptyFile(part)) return ReasonOf(errno);
  ::unlink(part.c_str());
  return "";
}

bool IsAsWritten(std::string const& part, TTransferState const& state) {
  struct stat status {};
  return ::lstat(part.c_str(), &status) == 0 && S_ISREG(status.st_mode) && status.st_dev == state.fDevice &&
         status.st_ino == state.fInode && static_cast<std::uint64_t>(status.st_size) == state.fMoved;
}

std::string PartText(std::string const& part) {
  std::error_code absent;
  std::uintmax_t const size = fs::file_size(part, absent);
  return absent ? "; nothing arrived" : "; the " + SizeText(size) + " that arrived are in " + Printable(part);
}

int RenamePart(std::string const& part, std::string const& file, bool overwrites) {
  SetAccess(part, file);
  if (Rename(part, file, overwrites)) return 0;
  int const error = errno;
  SetMode(part, kModeOfPart);
  return error;
}

}  // namespace NQRVZEP20::zep
