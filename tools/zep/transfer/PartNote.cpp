// SPDX-License-Identifier: Apache-2.0
#include "tools/zep/transfer/PartNote.h"

#include "core/Handles.h"
#include "tools/zep/processes/WriteWhole.h"

#include <fcntl.h>
#include <sys/stat.h>
#include <unistd.h>

#include <cerrno>

namespace NQRVZEP20::zep {

namespace {

constexpr char const* kFirstLine = "zep get: the part beside this file is the beginning of\n";
constexpr std::size_t kMostBytesOfNote = 65536;

std::string NameOfNote(std::string const& part) { return part + ".from"; }

// The first kMostBytesOfNote of a regular file; empty if it cannot be read.
std::string BeginningOf(std::string const& path) {
  TUniqueFd const file(::open(path.c_str(), O_RDONLY | O_NOFOLLOW | O_NONBLOCK | O_CLOEXEC));
  struct stat status {};
  if (!file || ::fstat(file.get(), &status) != 0 || !S_ISREG(status.st_mode)) return "";
  std::string text(kMostBytesOfNote, '\0');
  std::size_t length = 0;
  for (ssize_t got = 1; got != 0 && length < text.size(); length += static_cast<std::size_t>(got)) {
    while ((got = ::read(file.get(), &text[length], text.size() - length)) < 0 && errno == EINTR) continue;
    if (got < 0) return "";
  }
  text.resize(length);
  return text;
}

}  // namespace

std::string NoteFor(std::string const& url, std::int64_t size) {
  return kFirstLine + url + "\n" + (size < 0 ? "size unknown" : std::to_string(size) + " bytes") + "\n";
}

std::string ReadNote(std::string const& part) {
  std::string text = BeginningOf(NameOfNote(part));
  return text.rfind(kFirstLine, 0) == 0 ? text : "";
}

void WriteNote(std::string const& part, std::string const& note) {
  RemoveNote(part);
  std::string const path = NameOfNote(part);
  TUniqueFd const file(::open(path.c_str(), O_WRONLY | O_CREAT | O_EXCL | O_CLOEXEC, 0600));
  if (file && !WriteWhole(file.get(), note)) ::unlink(path.c_str());
}

void RemoveNote(std::string const& part) {
  if (!ReadNote(part).empty()) ::unlink(NameOfNote(part).c_str());
}

}  // namespace NQRVZEP20::zep
