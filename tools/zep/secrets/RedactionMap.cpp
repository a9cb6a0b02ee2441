// SPDX-License-Identifier: Apache-2.0
#include "tools/zep/secrets/RedactionMap.h"

#include "collect/stored/StoredDocument.h"
#include "tools/zep/output/Failure.h"
#include "tools/zep/output/Json.h"
#include "tools/zep/output/OutputFile.h"
#include "tools/zep/transfer/Sha256.h"

#include <sys/random.h>
#include <sys/stat.h>
#include <unistd.h>

#include <cerrno>
#include <cstdint>
#include <cstdio>
#include <cstdlib>
#include <filesystem>
#include <system_error>

namespace NQRVZEP20::zep {

namespace {

namespace fs = std::filesystem;

std::string Variable(char const* name) {
  char const* const value = std::getenv(name);
  return value != nullptr ? value : "";
}

std::string StateDirectory() {
  std::string const state = Variable("XDG_STATE_HOME"), home = Variable("HOME");
  if (!state.empty()) return state + "/zep";
  if (home.empty()) throw TWrongUsage("HOME is not set, so that the redaction map has no place; name it with --redaction-map");
  return home + "/.local/state/zep";
}

std::string NewId() {
  std::uint64_t number = 0;
  if (::getrandom(&number, sizeof number, 0) != sizeof number) throw TFailure(kExitNothing, "the system has no random numbers");
  char text[17];
  std::snprintf(text, sizeof text, "%016llx", static_cast<unsigned long long>(number));
  return text;
}

std::string ChecksumOf(TJson const& document) { return Sha256OfText(AsVerbatimLine(document["values"])); }

void RefuseIfOthersMayRead(std::string const& file) {
  struct stat status {};
  if (::stat(file.c_str(), &status) == 0 && (status.st_mode & (S_IRWXG | S_IRWXO)) != 0)
    throw TRedactionError("other users can read it; chmod 600 makes it private");
}

TPseudonyms MapFrom(std::string const& text) {
  TJson const document = TJson::parse(text, nullptr, false);
  if (document.is_discarded()) throw TRedactionError("it is cut, or is not a redaction map of zep");
  TPseudonyms pseudonyms = TPseudonyms::From(document);
  if (document.value("sha256", TJson()) != ChecksumOf(document))
    throw TRedactionError("/sha256: does not match the values; it was altered");
  return pseudonyms;
}

// Creates the directory of the usual map. A failure shows when the map is written.
std::string WithDirectory(std::string const& file) {
  std::error_code ignored;
  fs::path const directory = fs::path(file).parent_path();
  bool const isUsual = directory.filename() == "zep" && !fs::exists(directory, ignored) && file == UsualRedactionMap();
  if (isUsual && fs::create_directories(directory, ignored)) fs::permissions(directory, fs::perms::owner_all, ignored);
  return file;
}

TPseudonyms MapIn(std::string const& file, TLockFile const& lock) {
  std::error_code ignored;
  fs::path const directory = fs::path(file).parent_path();
  bool const isWritable = ::access(directory.empty() ? "." : directory.c_str(), W_OK) == 0;
  std::string const why = isWritable ? "another zep is using it; try again" : std::generic_category().message(errno);
  if (!lock.WhyNotHeld().empty()) throw TFailure(kExitNotWritten, file + " cannot be written: " + why);
  return fs::exists(file, ignored) ? ReadRedactionMap(file) : TPseudonyms(NewId());
}

}  // namespace

std::string UsualRedactionMap() { return StateDirectory() + "/redaction-map.json"; }

TPseudonyms ReadRedactionMap(std::string const& file) {
  try {
    RefuseIfOthersMayRead(file);
    std::string const text = ReadStoredText(file);
    return MapFrom(text);
  } catch (TRedactionError const& failure) {
    throw TFailure(kExitNoInput, file + ": " + failure.what());
  } catch (TStoredReportError const& failure) {
    throw TFailure(kExitNoInput, failure.what());
  }
}

TRedactionMap::TRedactionMap(std::string const& file)
    : fFile(WithDirectory(file)), fLock(file + ".lock"), fPseudonyms(MapIn(file, fLock)) {}

void TRedactionMap::Save() const {
  TJson document = fPseudonyms.AsJson();
  document["sha256"] = ChecksumOf(document);
  WritePrivateFile(fFile, AsVerbatimText(document));
}

}  // namespace NQRVZEP20::zep
