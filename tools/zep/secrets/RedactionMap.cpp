// SPDX-License-Identifier: Apache-2.0
#include "tools/zep/secrets/RedactionMap.h"

#include "collect/stored/StoredDocument.h"
#include "tools/zep/output/Failure.h"
#include "tools/zep/output/Json.h"
#include "tools/zep/output/OutputFile.h"
#include "tools/zep/output/Text.h"
#include "tools/zep/secrets/PrivateFile.h"
#include "tools/zep/transfer/Sha256.h"

#include <sys/random.h>

#include <cstdint>
#include <cstdio>
#include <cstdlib>
#include <filesystem>
#include <system_error>

namespace NQRVZEP20::zep {

namespace {

namespace fs = std::filesystem;

constexpr std::size_t kMostBytes = 16 << 20;  // of a map, which gains a hundred bytes with each secret

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

TPseudonyms MapFrom(std::string_view text) {
  TJson const document = ParsedWithinBounds(text);
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
  std::string const& why = lock.WhyNotHeld();
  if (!why.empty()) throw TFailure(kExitNotWritten, file + " cannot be written: " + why + " (--redaction-map names another map)");
  std::error_code ignored;
  return fs::exists(file, ignored) ? ReadRedactionMap(file) : TPseudonyms(NewId());
}

}  // namespace

std::string UsualRedactionMap() { return StateDirectory() + "/redaction-map.json"; }

TPseudonyms ReadRedactionMap(std::string const& file) {
  try {
    TPrivateFile const contents(file, kMostBytes);
    if (contents.Error() != 0) throw TRedactionError(contents.Reason());
    if (std::string const why = contents.WhyNotPrivate(); !why.empty()) throw TRedactionError(why);
    return MapFrom(contents.Text());
  } catch (TRedactionError const& failure) {
    throw TFailure(kExitNoInput, file + ": " + failure.what());
  } catch (TStoredReportError const& failure) {
    throw TFailure(kExitNoInput, file + ": " + failure.what());
  }
}

TRedactionMap::TRedactionMap(std::string const& file)
    : fFile(WithDirectory(file)), fLock(file + ".lock"), fPseudonyms(MapIn(file, fLock)) {}

void TRedactionMap::Save() const {
  TJson document = fPseudonyms.AsJson();
  document["sha256"] = ChecksumOf(document);
  std::string const text = AsVerbatimText(document);
  if (text.size() > kMostBytes)
    throw TFailure(kExitNotWritten,
                   fFile + " would be longer than " + ExactSizeText(kMostBytes) + "; begin another map with --redaction-map");
  WritePrivateFile(fFile, text);
}

}  // namespace NQRVZEP20::zep
