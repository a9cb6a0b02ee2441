#include "TOSSpecific.h"
#include "TZEPException.h"

#include <sys/stat.h>

#include <cerrno>

namespace NQRVZEP20 {
namespace {

[[noreturn]] void ThrowMkdirError(int error) {
  if (error == EEXIST) throw TZEPException(kZEPStatusDirectoryAlreadyExists);
  if (error == EACCES || error == EROFS) throw TZEPException(kZEPStatusAccessDenied);
  throw TZEPException(kZEPStatusFileSystemError);
}

}  // namespace

std::string const TOSSpecific::kFileSeparator = "/";

// The logger itself uses these tests and CreateDir, so they write nothing to the log.

bool TOSSpecific::FileExists(std::string path) {
  struct stat status;
  return ::stat(path.c_str(), &status) == 0 && !S_ISDIR(status.st_mode);
}

bool TOSSpecific::DirExists(std::string path) {
  struct stat status;
  return ::stat(path.c_str(), &status) == 0 && S_ISDIR(status.st_mode);
}

int TOSSpecific::CreateDir(std::string path) {
  if (::mkdir(path.c_str(), 0777) != 0) ThrowMkdirError(errno);
  return 0;
}

bool TOSSpecific::isOEMBuild() { return FileExists("docs/oem_zep_preboot_readme.txt"); }

}  // namespace NQRVZEP20
