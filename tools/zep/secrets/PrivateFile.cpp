// SPDX-License-Identifier: Apache-2.0
#include "tools/zep/secrets/PrivateFile.h"

#include "core/Handles.h"
#include "tools/zep/output/Text.h"
#include "tools/zep/processes/Interrupts.h"

#include <fcntl.h>
#include <sys/stat.h>
#include <unistd.h>

#include <cerrno>
#include <cstdio>
#include <iostream>
#include <set>
#include <system_error>

namespace NQRVZEP20::zep {

namespace {

std::string Octal(mode_t mode) {
  char text[16];
  std::snprintf(text, sizeof text, "%04o", static_cast<unsigned>(mode & 07777));
  return text;
}

// Reads the next bytes. Returns their number, 0 at the end of the file, or -1 with errno, which is EINTR when an interrupt is
// pending.
ssize_t ReadNext(int file, TSecretBytes& chunk) {
  while (WaitForInput(file)) {
    ssize_t const got = ::read(file, chunk.data(), chunk.size());
    if (got >= 0 || (errno != EINTR && errno != EAGAIN)) return got;
  }
  errno = EINTR;
  return -1;
}

}  // namespace

TPrivateFile::TPrivateFile(std::string const& path, std::size_t mostBytes) : fPath(path), fMostBytes(mostBytes) {
  TUniqueFd const file(::open(path.c_str(), O_RDONLY | O_NONBLOCK | O_CLOEXEC | O_NOCTTY));
  struct stat status {};
  if (file && ::fstat(file.get(), &status) == 0) {
    fMode = status.st_mode;
    fOwner = status.st_uid;
  }
  TSecretBytes chunk(4096);
  ssize_t got = file ? 1 : -1;
  while (got > 0 && fText.size() <= fMostBytes) {
    got = ReadNext(file.get(), chunk);
    if (got > 0) fText.insert(fText.end(), chunk.begin(), chunk.begin() + got);
  }
  if (got < 0)
    fError = errno;
  else if (fText.size() > fMostBytes)
    fError = EFBIG;
  if (fError != 0) fText = {};
}

std::string TPrivateFile::Reason() const {
  return fError == EFBIG ? "it is longer than " + ExactSizeText(fMostBytes) : std::generic_category().message(fError);
}

std::string TPrivateFile::WhyNotPrivate() const {
  if (!S_ISREG(fMode)) return "";
  if (fOwner != ::geteuid()) return "it belongs to another user; copy it to a file of your own";
  return (fMode & (S_IRWXG | S_IRWXO)) == 0 ? "" : "other users can read or change it; chmod 600 makes it private";
}

void TPrivateFile::WarnWhenOthersMayRead(std::string const& secrets) const {
  static std::set<std::string> warned;
  if (!S_ISREG(fMode) || (fMode & S_IROTH) == 0 || !warned.insert(fPath).second) return;
  std::cerr << "zep: warning: every user may read " << secrets << " in " << Printable(fPath) << " (mode " << Octal(fMode)
            << "); chmod 600 makes it private\n";
}

std::string NameOfPrivateFile(std::string const& path, std::string const& option) {
  bool const isNothing = ::access(path.c_str(), F_OK) != 0;
  int const error = errno;
  std::string const name = isNothing ? "the file of " + option : path;
  errno = error;
  return name;
}

}  // namespace NQRVZEP20::zep
