#include "TOSSpecific.h"
#include "TZEPException.h"

#include <sys/stat.h>

#include <algorithm>
#include <cerrno>

namespace NQRVZEP20 {
namespace {

[[noreturn]] void ThrowMkdirError(int error) {
  if (error == EEXIST) throw TZEPException(kZEPStatusDirectoryAlreadyExists);
  if (error == EACCES || error == EROFS) throw TZEPException(kZEPStatusAccessDenied);
  throw TZEPException(kZEPStatusFileSystemError);
}

}  // namespace

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

bool TOSSpecific::removeNonAlpaNumeric(std::string& text) {
  if (std::size_t const open = text.find('['); open != std::string::npos) text.erase(0, open + 1);
  if (std::size_t const close = text.find(']'); close != std::string::npos) text.erase(close);
  return true;
}

bool TOSSpecific::breakApartVersion(std::string& tail, std::string& head) {
  std::size_t const first = tail.find('-');
  if (first == std::string::npos) return true;
  std::size_t const second = tail.find('-', first + 1);
  std::size_t const cut = second == std::string::npos ? first : second;
  head = tail.substr(0, cut);
  tail.erase(0, cut + 1);
  return true;
}

std::vector<std::string> TOSSpecific::multiStringTok(char* buffer, unsigned long length, char separator) {
  std::vector<std::string> strings;
  if (length < 2) return strings;
  // A string that ends at this mark or behind it is not taken, so nothing from the mark on is looked at.
  char const* const endMark = buffer + length - 2;
  char const* start = buffer;
  for (char const* end = std::find(start, endMark, separator); end != endMark; end = std::find(start, endMark, '\0')) {
    strings.emplace_back(start, end);
    start = end + 1;
  }
  return strings;
}

}  // namespace NQRVZEP20
