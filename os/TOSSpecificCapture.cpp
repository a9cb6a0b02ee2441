// SPDX-License-Identifier: Apache-2.0
#include "TOSSpecific.h"
#include "core/Failure.h"
#include "core/Handles.h"
#include "core/Log.h"

#include <fcntl.h>
#include <sys/mman.h>
#include <sys/stat.h>
#include <unistd.h>

#include <cstdlib>
#include <memory>

namespace NQRVZEP20 {
namespace {

constexpr int kCaptureTimeoutSeconds = 300;

constexpr std::size_t kReadSize = 4096;
constexpr std::size_t kLargeReadSize = 256 * 1024;

// Requests large pages for memory that is not in use yet: a file of a gibibyte is read in two thirds of the time.
void UseLargePages(char* memory, std::size_t size) {
  constexpr std::size_t kPage = 4096;
  void* from = memory;
  if (std::align(kPage, kPage, from, size) != nullptr) ::madvise(from, size - size % kPage, MADV_HUGEPAGE);
}

// Reserves memory for a regular file that is larger than one read, and returns the size of the reads. A file that grows
// meanwhile, or reports a wrong size, is read to its end as well. Devices and most files of /proc and /sys report no size and
// are read in small pieces.
std::size_t MakeRoomFor(int fd, std::string& contents) {
  constexpr off_t kMostRoom = off_t{1} << 32, kLeastForLargePages = off_t{1} << 24;
  struct stat status;
  if (::fstat(fd, &status) != 0 || !S_ISREG(status.st_mode) || status.st_size <= off_t{kReadSize}) return kReadSize;
  if (status.st_size > kMostRoom) return kLargeReadSize;
  contents.reserve(static_cast<std::size_t>(status.st_size));
  if (status.st_size >= kLeastForLargePages) UseLargePages(contents.data(), contents.capacity());
  return kLargeReadSize;
}

void RunInShell(std::string const& command) {
  // The user sees the result of the command; it is not checked.
  [[maybe_unused]] int const ignored = std::system(command.c_str());
}

}  // namespace

void TOSSpecific::CapFileViaProc(std::string program, std::vector<std::string> args, std::string fileName,
                                 std::string& contents) {
  try {
    SpawnProcess(program, args, kCaptureTimeoutSeconds);
    contents = CaptureFile(fileName);
  } catch (std::exception const& failure) {
    contents.clear();
    LogError("failed to capture file content due to exception: ", failure.what());
  }
}

std::string TOSSpecific::CaptureFile(std::string path) {
  TUniqueFd const file(::open(path.c_str(), O_RDONLY));
  if (!file) LogErrorAndThrow(kZEPStatusFileNotFound, "ERROR: CaptureFile ", "failed to open: " + path);
  return GetFileContents(file.get(), path, true);
}

std::string TOSSpecific::CaptureFileLoader(std::string path, bool logContents) {
  TUniqueFd const file(::open(path.c_str(), O_RDONLY));
  if (!file) {
    LogDebug("CaptureFile failed to open: ", path);
    LogDebug("Please confirm that the related software/driver is properly installed.");
    return "";
  }
  return GetFileContents(file.get(), path, logContents);
}

std::string TOSSpecific::GetFileContents(int fd, std::string path, bool logContents) {
  std::string contents;
  std::vector<char> buffer(MakeRoomFor(fd, contents));
  ssize_t got;
  while ((got = ::read(fd, buffer.data(), buffer.size())) > 0) contents.append(buffer.data(), static_cast<std::size_t>(got));
  if (got < 0) LogAndThrow(ILogger::kLogStatus, kZEPStatusFileSystemError, "GetFileContents ", "failed to read file " + path);
  if (logContents) LogDebug("Debug (linux toss): GetFileContents() Returned: ", contents);
  return contents;
}

void TOSSpecific::LaunchTextEditor(std::string path) {
  char buffer[4096];
  bool const hasDirectory = ::getcwd(buffer, sizeof buffer) != nullptr;
  RunInShell("cp " + path + " " + (hasDirectory ? buffer : "/"));
  // A path of fewer than 35 characters throws here, after the copy. Kept.
  std::string const name = path.substr(path.size() - 35);
  RunInShell((hasDirectory ? "vi *" : "vi /*") + name + "*");
}

}  // namespace NQRVZEP20
