// SPDX-License-Identifier: Apache-2.0
#include "tools/zep/transfer/TLockFile.h"

#include "tools/zep/output/Text.h"
#include "tools/zep/transfer/LocalFile.h"

#include <fcntl.h>
#include <sys/file.h>
#include <sys/stat.h>
#include <unistd.h>

#include <cerrno>
#include <utility>

namespace NQRVZEP20::zep {

TLockFile::TLockFile(std::string path) : fPath(std::move(path)) {
  while (Open() && !IsStillThere()) fFile = TUniqueFd();  // the process that held the lock has just removed the file
}

TLockFile::~TLockFile() {
  struct stat held {};
  bool const isEmpty = fFile && ::fstat(fFile.get(), &held) == 0 && held.st_size == 0;
  if (isEmpty && IsStillThere()) ::unlink(fPath.c_str());
}

bool TLockFile::Open() {
  fFile = TUniqueFd(::open(fPath.c_str(), O_RDWR | O_CREAT | O_NOFOLLOW | O_NONBLOCK | O_CLOEXEC, 0666));
  int const openError = errno;
  struct stat opened {};
  bool const isRegular = fFile && ::fstat(fFile.get(), &opened) == 0 && S_ISREG(opened.st_mode);
  if (isRegular && ::flock(fFile.get(), LOCK_EX | LOCK_NB) == 0) return true;
  if (!fFile)
    fWhyNotHeld = Printable(fPath) + " cannot be opened: " + ReasonOf(openError);
  else
    fWhyNotHeld = isRegular ? WhyNotLocked(errno) : Printable(fPath) + " is not a regular file";
  fFile = TUniqueFd();
  return false;
}

// Whether the path still names the locked file.
bool TLockFile::IsStillThere() const {
  struct stat held {
  }, named{};
  return ::fstat(fFile.get(), &held) == 0 && ::stat(fPath.c_str(), &named) == 0 && IsSameFile(held, named);
}

std::string TLockFile::WhyNotLocked(int error) const {
  if (error == EWOULDBLOCK) return "another zep is using the file; try again when it has ended";
  bool const isUnsupported = error == EBADF || error == ENOLCK || error == EOPNOTSUPP;
  return Printable(fPath) + " cannot be locked: " + ReasonOf(error) +
         (isUnsupported ? "; its file system does not support locks: use another directory" : "");
}

}  // namespace NQRVZEP20::zep
