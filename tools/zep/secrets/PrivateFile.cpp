// SPDX-License-Identifier: Apache-2.0
#include "tools/zep/secrets/PrivateFile.h"

#include "core/Handles.h"
#include "tools/zep/output/Text.h"
#include "tools/zep/processes/Interrupts.h"

#include <fcntl.h>
#include <sys/stat.h>

#include <cerrno>
#include <cstdio>
#include <iostream>
#include <set>
#include <system_error>

namespace NQRVZEP20::zep {

namespace {

constexpr std::size_t kMostBytes = 1 << 20;

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

TPrivateFile::TPrivateFile(std::string const& path) : fPath(path) {
  TUniqueFd const file(::open(path.c_str(), O_RDONLY | O_NONBLOCK | O_CLOEXEC | O_NOCTTY));
  struct stat status {};
  if (file && ::fstat(file.get(), &status) == 0) fMode = status.st_mode;
  TSecretBytes chunk(4096);
  ssize_t got = file ? 1 : -1;
  while (got > 0 && fText.size() <= kMostBytes) {
    got = ReadNext(file.get(), chunk);
    if (got > 0) fText.insert(fText.end(), chunk.begin(), chunk.begin() + got);
  }
  if (got < 0)
    fError = errno;
  else if (fText.size() > kMostBytes)
    fError = EFBIG;
  if (fError != 0) fText = {};
}

std::string TPrivateFile::Reason() const {
  return fError == EFBIG ? "it is longer than " + ExactSizeText(kMostBytes) : std::generic_category().message(fError);
}

void TPrivateFile::WarnWhenOthersMayRead() const {
  static std::set<std::string> warned;
  if (!S_ISREG(fMode) || (fMode & S_IROTH) == 0 || !warned.insert(fPath).second) return;
  std::cerr << "zep: warning: every user may read the passwords in " << Printable(fPath) << " (mode " << Octal(fMode)
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
