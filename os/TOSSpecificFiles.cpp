// SPDX-License-Identifier: Apache-2.0
#include "TOSSpecific.h"
#include "TZEPException.h"
#include "core/Failure.h"
#include "core/Handles.h"
#include "core/Log.h"
#include "os/Directories.h"

#include <dirent.h>
#include <fcntl.h>
#include <sys/stat.h>
#include <unistd.h>

#include <algorithm>
#include <cerrno>
#include <cstdlib>

namespace NQRVZEP20 {
namespace {

[[noreturn]] void ThrowMkdirError(int error) {
  if (error == EEXIST) throw TZEPException(kZEPStatusDirectoryAlreadyExists);
  if (error == EACCES || error == EROFS) throw TZEPException(kZEPStatusAccessDenied);
  throw TZEPException(kZEPStatusFileSystemError);
}

// A last line counts even without its newline.
std::vector<std::string> LinesOf(std::string const& text) {
  std::vector<std::string> lines;
  for (std::size_t start = 0; start < text.size();) {
    std::size_t const end = std::min(text.find('\n', start), text.size());
    lines.push_back(text.substr(start, end - start));
    start = end + 1;
  }
  return lines;
}

// ---- Streams ----

// Prevents a stream from throwing while this object lives. Afterwards the stream throws for later failures, but not for the
// state in which it is left.
class TStreamHeldBack {
public:
  explicit TStreamHeldBack(std::ios& stream) : fStream(stream), fMask(stream.exceptions()) {
    fStream.exceptions(std::ios::goodbit);
  }
  ~TStreamHeldBack() {
    try {
      fStream.exceptions(fMask);
    } catch (std::ios::failure const&) {  // thrown for the current state; the mask is set nevertheless
    }
  }
  TStreamHeldBack(TStreamHeldBack const&) = delete;
  TStreamHeldBack& operator=(TStreamHeldBack const&) = delete;

private:
  std::ios& fStream;
  std::ios::iostate fMask;
};

}  // namespace

// The logger itself uses FileExists, DirExists and CreateDir, so they log nothing.

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

long TOSSpecific::GetFileSize(std::string path) {
  struct stat status;
  if (!FileExists(path) || ::stat(path.c_str(), &status) != 0) throw TZEPException(kZEPStatusFileNotFound);
  return status.st_size;
}

std::vector<std::string> TOSSpecific::ListDir(std::string path) {
  TUniqueDir const dir = OpenDirOrThrow(path);
  std::vector<std::string> names;
  while (dirent const* const entry = ::readdir(dir.get()))
    if (!IsDotOrDotDot(entry->d_name)) names.emplace_back(entry->d_name);
  return names;
}

std::vector<std::string> TOSSpecific::FindFile(std::string name) {
  constexpr int kTimeoutSeconds = 300;
  return LinesOf(SpawnProcess("find", {name}, kTimeoutSeconds));
}

bool TOSSpecific::deleteFile(std::string path) {
  LogDebug("Entering TOSSpecific::deleteFile, path=", path);
  // Neither quoted nor escaped, so the path may contain shell patterns. Kept.
  [[maybe_unused]] int const ignored = std::system(("rm -f " + path).c_str());
  LogDebug("Exiting TOSSpecific::deleteFile");
  return true;
}

bool TOSSpecific::createFile(std::string path, std::string contents) {
  LogDebug("Entering TOSSpecific::createFile, path=", path);
  TUniqueFd file(::open(path.c_str(), O_RDWR | O_CREAT | O_TRUNC, 0644));
  if (!file) {
    int const error = errno;
    LogDebug("Unable to create file, errno=", error);
    return false;
  }
  // One write, whose result is ignored. Kept.
  [[maybe_unused]] ssize_t const ignored = ::write(file.get(), contents.data(), contents.size());
  file.reset();
  LogDebug("Successfully created file: ", path);
  LogDebug("Exiting TOSSpecific::createFile");
  return true;
}

void TOSSpecific::OpenOutputFileStream(std::ofstream& stream, std::string path) {
  LogDebug("TOSSpecific::OpenOutputFileStream -- Entering ");
  TStreamHeldBack const heldBack(stream);
  if (stream.is_open()) stream.close();
  stream.clear();
  stream.open(path);
  if (!stream.is_open()) {
    EZEPStatusCode const code = errno == EACCES ? kZEPStatusAccessDenied : kZEPStatusFileSystemError;
    LogErrorAndThrow(code, "TOSSpecific::OpenOutputFileStream --  ", "Failed to open output file: " + path);
  }
  LogDebug("TOSSpecific::OpenOutputFileStream -- Exting ");
}

}  // namespace NQRVZEP20
