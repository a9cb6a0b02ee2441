// SPDX-License-Identifier: Apache-2.0
#include "FileSystemUse.h"

#include <sys/statvfs.h>

#include <cerrno>
#include <cstring>
#include <sstream>

namespace NQRVZEP20 {

namespace {

TFinding<std::string> AskKernel(std::string const& mountPoint) {
  struct statvfs status;
  if (::statvfs(mountPoint.c_str(), &status) != 0)
    return TMissing{kMissingUnreadable, "statvfs fails for " + mountPoint + ": " + std::strerror(errno)};
  std::ostringstream text;
  text << status.f_bsize << ' ' << status.f_frsize << ' ' << status.f_blocks << ' ' << status.f_bfree << ' ' << status.f_bavail
       << ' ' << status.f_files << ' ' << status.f_ffree << ' ' << status.f_namemax << '\n';
  return text.str();
}

}  // namespace

TFinding<TFileSystemUse> UseFrom(std::string const& text) {
  std::istringstream numbers(text);
  TFileSystemUse use{};
  numbers >> use.fBlockSize >> use.fFragmentSize >> use.fSize >> use.fFree >> use.fAvailable >> use.fFiles >> use.fFreeFiles >>
      use.fMaxNameLength;
  if (!numbers) return TMissing{kMissingUnexpected, "\"" + text + "\" is not an answer of statvfs"};
  for (unsigned long* const size : {&use.fSize, &use.fFree, &use.fAvailable})
    if (__builtin_mul_overflow(*size, use.fFragmentSize, size))
      return TMissing{kMissingUnexpected, "statvfs reports more bytes than a number can hold"};
  return use;
}

TFinding<TFileSystemUse> UseOf(TMachineFiles const& files, std::string const& mountPoint) {
  return files.Answer("statvfs" + mountPoint + "/values", [&] { return AskKernel(mountPoint); }).Then(UseFrom);
}

}  // namespace NQRVZEP20
