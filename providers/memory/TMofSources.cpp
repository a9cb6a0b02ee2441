#include "TMofSources.h"

#include <algorithm>
#include <cerrno>
#include <fstream>
#include <system_error>

namespace NQRVZEP20 {

namespace fs = std::filesystem;

namespace {

constexpr std::size_t kMostOpenFiles = 100;

std::string ReasonOf(int error) { return std::generic_category().message(error); }

EZEPStatusCode StatusOf(int error) {
  if (error == ENOENT) return kZEPStatusFileNotFound;
  return error == EACCES ? kZEPStatusAccessDenied : kZEPStatusFileSystemError;
}

// The path without links and dots; empty, with the reason, when there is no such file, or it is no regular one.
fs::path RegularFile(fs::path const& path, int& error) {
  std::error_code failure;
  const fs::path canonical = fs::canonical(path, failure);
  const bool isRegular = !failure && fs::is_regular_file(canonical, failure);
  error = failure ? failure.value() : isRegular ? 0 : fs::is_directory(canonical) ? EISDIR : EINVAL;
  return error == 0 ? canonical : fs::path();
}

bool ReadWhole(fs::path const& path, std::string& text) {
  std::ifstream file(path, std::ios::binary);
  if (!file) return false;
  file.seekg(0, std::ios::end);
  text.resize(static_cast<std::size_t>(std::max<std::streamoff>(file.tellg(), 0)));
  file.seekg(0);
  file.read(text.data(), static_cast<std::streamsize>(text.size()));
  return static_cast<bool>(file);
}

bool IsWithin(fs::path const& folder, fs::path const& path) {
  return std::mismatch(folder.begin(), folder.end(), path.begin(), path.end()).first == folder.end();
}

}  // namespace

TMofFile const& TMofSources::OpenFirst(std::string const& path) {
  int error = 0;
  const fs::path canonical = RegularFile(path, error);
  std::string text;
  if (error == 0 && !ReadWhole(canonical, text)) error = errno != 0 ? errno : EIO;
  if (error != 0) throw TMofError(path + ": cannot be read: " + ReasonOf(error), StatusOf(error));
  fFolder = canonical.parent_path();
  fOpen.push_back({canonical, path});
  return Add(path, std::move(text));
}

TMofFile const& TMofSources::OpenText(std::string const& text, std::string const& name) { return Add(name, text); }

TMofFile const& TMofSources::OpenIncluded(std::string const& name, TMofPlace const& directive) {
  if (fFolder.empty()) throw TMofError(directive, "a text that is no file cannot include one");
  if (fOpen.size() >= kMostOpenFiles) throw TMofError(directive, "files include one another more than 100 deep");

  int error = 0;
  const fs::path canonical = RegularFile(fOpen.back().fPath.parent_path() / name, error);
  if (error == 0 && !IsWithin(fFolder, canonical))
    throw TMofError(directive, "the included file lies outside the folder of the first one", kZEPStatusAccessDenied);
  const auto isIt = [&canonical](TOpen const& open) { return open.fPath == canonical; };
  if (error == 0 && std::any_of(fOpen.begin(), fOpen.end(), isIt)) throw TMofError(directive, "the file includes itself");

  std::string text;
  if (error == 0 && !ReadWhole(canonical, text)) error = errno != 0 ? errno : EIO;
  if (error != 0) throw TMofError(directive, "the included file cannot be read: " + ReasonOf(error), StatusOf(error));
  fOpen.push_back({canonical, fOpen.back().fName.parent_path() / name});
  return Add(fOpen.back().fName.string(), std::move(text));
}

TMofFile const& TMofSources::Add(std::string const& name, std::string text) {
  fDocument.fFiles.push_back(std::make_unique<TMofFile>(TMofFile{name, std::move(text)}));
  return *fDocument.fFiles.back();
}

}  // namespace NQRVZEP20
