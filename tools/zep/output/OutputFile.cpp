// SPDX-License-Identifier: Apache-2.0
#include "tools/zep/output/OutputFile.h"

#include "core/Handles.h"
#include "tools/zep/output/Failure.h"
#include "tools/zep/processes/Interrupts.h"
#include "tools/zep/processes/WriteWhole.h"

#include <stdlib.h>
#include <sys/stat.h>
#include <unistd.h>

#include <cerrno>
#include <cstdio>
#include <cstring>

namespace NQRVZEP20::zep {

namespace {

[[noreturn]] void Throw(std::string const& file, std::string const& why) {
  throw TFailure(kExitNotWritten, file + " cannot be written: " + why);
}

// The mode of the file that is replaced or, for a new one, that which the shell would give it.
mode_t ModeFor(std::string const& file) {
  struct stat target {};
  if (::lstat(file.c_str(), &target) == 0) return target.st_mode & 0777;
  mode_t const mask = ::umask(0);
  ::umask(mask);
  return 0666 & ~mask;
}

void RefuseUnlessRegular(std::string const& file) {
  struct stat target {};
  if (::lstat(file.c_str(), &target) == 0 && !S_ISREG(target.st_mode)) Throw(file, "it is not a regular file");
}

bool WriteAndRename(int draft, mode_t mode, std::string const& name, std::string const& file, std::string const& text) {
  return WriteWhole(draft, text) && ::fchmod(draft, mode) == 0 && ::fsync(draft) == 0 &&
         std::rename(name.c_str(), file.c_str()) == 0;
}

void WriteFileWithMode(std::string const& file, std::string const& text, mode_t mode) {
  TInterruptsBlocked const untilTheDraftIsGone;
  std::string name = file + ".XXXXXX";
  TUniqueFd const draft(::mkstemp(name.data()));
  if (!draft) Throw(file, std::strerror(errno));
  if (WriteAndRename(draft.get(), mode, name, file, text)) return;
  int const error = errno;
  ::unlink(name.c_str());
  Throw(file, std::strerror(error));
}

}  // namespace

void WriteOutputFile(std::string const& file, std::string const& text) {
  RefuseUnlessRegular(file);
  WriteFileWithMode(file, text, ModeFor(file));
}

void WritePrivateFile(std::string const& file, std::string const& text) {
  RefuseUnlessRegular(file);
  WriteFileWithMode(file, text, S_IRUSR | S_IWUSR);
}

}  // namespace NQRVZEP20::zep
