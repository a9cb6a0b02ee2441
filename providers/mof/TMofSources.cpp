// SPDX-License-Identifier: Apache-2.0
#include "providers/mof/TMofSources.h"

#include "core/Handles.h"

#include <fcntl.h>
#include <sys/stat.h>
#include <unistd.h>

#include <algorithm>
#include <cerrno>
#include <system_error>

namespace NQRVZEP20 {

namespace fs = std::filesystem;

namespace {

constexpr std::size_t kMaxOpenFiles = 100;

std::string ReasonOf(int error) { return std::generic_category().message(error); }

EZEPStatusCode StatusOf(int error) {
  if (error == ENOENT) return kZEPStatusFileNotFound;
  return error == EACCES ? kZEPStatusAccessDenied : kZEPStatusFileSystemError;
}

// The canonical path. Empty, with the reason in `error`, when the file is missing or is not a regular file.
fs::path RegularFile(fs::path const& path, int& error) {
  std::error_code failure;
  fs::path const canonical = fs::canonical(path, failure);
  bool const isRegular = !failure && fs::is_regular_file(canonical, failure);
  error = failure ? failure.value() : isRegular ? 0 : fs::is_directory(canonical) ? EISDIR : EINVAL;
  return error == 0 ? canonical : fs::path();
}

// Reads to the end of the file, whatever size it reports: a file that changes meanwhile, or has no size, is neither cut nor
// padded. Returns 0, or the errno of a failure, after which `text` is unspecified.
int ReadToEnd(fs::path const& path, std::string& text) {
  constexpr std::size_t kMinBuffer = 4096;
  TUniqueFd const file(::open(path.c_str(), O_RDONLY | O_CLOEXEC));
  if (!file) return errno;
  struct stat status = {};
  if (::fstat(file.get(), &status) != 0) return errno;

  // One byte more than the size, so that the end is found without growing the buffer.
  text.resize(std::max(static_cast<std::size_t>(status.st_size) + 1, kMinBuffer));
  std::size_t size = 0;
  for (;;) {
    ssize_t const got = ::read(file.get(), text.data() + size, text.size() - size);
    if (got < 0) return errno;
    if (got == 0) break;
    size += static_cast<std::size_t>(got);
    if (size == text.size()) text.resize(2 * size);
  }
  text.resize(size);
  return 0;
}

bool IsWithin(fs::path const& folder, fs::path const& path) {
  return std::mismatch(folder.begin(), folder.end(), path.begin(), path.end()).first == folder.end();
}

}  // namespace

TMofFile const& TMofSources::OpenFirst(std::string const& path) {
  int error = 0;
  fs::path const canonical = RegularFile(path, error);
  std::string text;
  if (error == 0) error = ReadToEnd(canonical, text);
  if (error != 0) throw TMofError(path + ": cannot be read: " + ReasonOf(error), StatusOf(error));
  fFolder = canonical.parent_path();
  fOpen.push_back({canonical, path});
  return Add(path, std::move(text));
}

TMofFile const& TMofSources::OpenText(std::string const& text, std::string const& name) { return Add(name, text); }

TMofFile const& TMofSources::OpenIncluded(std::string const& name, TMofSpan const& directive) {
  if (fFolder.empty()) throw TMofError(directive, "only a file can include another file");
  if (fOpen.size() >= kMaxOpenFiles) throw TMofError(directive, "files include one another more than 100 levels deep");

  int error = 0;
  fs::path const canonical = RegularFile(fOpen.back().fPath.parent_path() / name, error);
  if (error == 0 && !IsWithin(fFolder, canonical))
    throw TMofError(directive, "the included file is outside the directory of the first file", kZEPStatusAccessDenied);
  auto const isSame = [&canonical](TOpen const& open) { return open.fPath == canonical; };
  if (error == 0 && std::any_of(fOpen.begin(), fOpen.end(), isSame)) throw TMofError(directive, "the file includes itself");

  std::string text;
  if (error == 0) error = ReadToEnd(canonical, text);
  if (error != 0) throw TMofError(directive, "the included file cannot be read: " + ReasonOf(error), StatusOf(error));
  fOpen.push_back({canonical, fOpen.back().fName.parent_path() / name});
  return Add(fOpen.back().fName.string(), std::move(text));
}

TMofFile const& TMofSources::Add(std::string const& name, std::string text) {
  fDocument.fFiles.push_back(std::make_unique<TMofFile>(TMofFile{name, std::move(text)}));
  return *fDocument.fFiles.back();
}

}  // namespace NQRVZEP20
