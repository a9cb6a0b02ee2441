// SPDX-License-Identifier: Apache-2.0
#include "TSdrCacheFile.h"

#include "IpmiText.h"
#include "core/Handles.h"

#include <fcntl.h>
#include <sys/stat.h>
#include <unistd.h>

#include <cctype>
#include <cstdlib>
#include <filesystem>

namespace NQRVZEP20 {

namespace {

constexpr std::size_t kLongestFile = std::size_t(4) << 20;
constexpr std::size_t kLongestRecord = 5 + 255, kMostRecords = 4096;

std::string SettingOf(char const* variable) {
  char const* const value = std::getenv(variable);
  return value != nullptr ? value : "";
}

// Empty if there is none.
std::string CacheDirectory() {
  std::string const cache = SettingOf("XDG_CACHE_HOME"), home = SettingOf("HOME");
  if (!cache.empty() && cache.front() == '/') return cache + "/zep";
  return !home.empty() && home.front() == '/' ? home + "/.cache/zep" : "";
}

// Only characters that have no meaning in paths; "%" and two digits for each other one.
std::string FileNameOf(std::string const& name) {
  std::string text = "sdr-";
  for (char const character : name) {
    bool const isPlain = std::isalnum(static_cast<unsigned char>(character)) != 0 || character == '-' || character == '.';
    text += isPlain ? std::string(1, character) : "%" + HexText(std::string(1, character));
  }
  return text.substr(0, 200);
}

TMissing NoCache() { return {kMissingNotGiven, "the sensor data records are not cached"}; }

TFinding<std::string> ContentOf(std::string const& path) {
  TUniqueFd const file(::open(path.c_str(), O_RDONLY | O_NOFOLLOW | O_NONBLOCK | O_CLOEXEC));
  struct stat status {};
  bool const isOurs = file && ::fstat(file.get(), &status) == 0 && S_ISREG(status.st_mode) && status.st_uid == ::geteuid();
  if (!isOurs || status.st_size < 0 || static_cast<std::size_t>(status.st_size) > kLongestFile) return NoCache();
  std::string content(static_cast<std::size_t>(status.st_size), '\0');
  ssize_t const got = ::read(file.get(), content.data(), content.size());
  if (got != status.st_size) return NoCache();
  return content;
}

// The bytes of hexadecimal digits; empty if there is anything else.
std::string BytesOf(std::string_view digits) {
  auto const valueOf = [](char digit) { return digit <= '9' ? digit - '0' : digit - 'a' + 10; };
  if (digits.size() % 2 != 0 || digits.find_first_not_of("0123456789abcdef") != std::string_view::npos) return "";
  std::string bytes;
  for (std::size_t i = 0; i < digits.size(); i += 2) bytes += static_cast<char>(valueOf(digits[i]) << 4 | valueOf(digits[i + 1]));
  return bytes;
}

// The lines after the head, each a record.
TFinding<std::vector<std::string>> RecordsFrom(std::string_view lines) {
  std::vector<std::string> records;
  while (!lines.empty()) {
    std::size_t const end = lines.find('\n');
    if (end == std::string_view::npos || records.size() == kMostRecords) return NoCache();
    std::string record = BytesOf(lines.substr(0, end));
    if (record.empty() || record.size() > kLongestRecord) return NoCache();
    records.push_back(std::move(record));
    lines.remove_prefix(end + 1);
  }
  return records;
}

bool WriteWhole(int file, std::string const& text) {
  return ::write(file, text.data(), text.size()) == static_cast<ssize_t>(text.size());
}

}  // namespace

TSdrCacheFile::TSdrCacheFile(std::string const& name, std::string identity) : fIdentity(std::move(identity)) {
  std::string const directory = CacheDirectory();
  if (!directory.empty()) fPath = directory + "/" + FileNameOf(name);
}

std::string TSdrCacheFile::HeadFor(std::string const& state) const {
  return "zep sensor data records 1 " + HexText(fIdentity) + " " + HexText(state) + "\n";
}

TFinding<std::vector<std::string>> TSdrCacheFile::Load(std::string const& state) const {
  return ContentOf(fPath).Then([&](std::string const& content) -> TFinding<std::vector<std::string>> {
    std::string const head = HeadFor(state);
    if (content.compare(0, head.size(), head) != 0) return NoCache();
    return RecordsFrom(std::string_view(content).substr(head.size()));
  });
}

void TSdrCacheFile::Save(std::string const& state, std::vector<std::string> const& records) const {
  if (fPath.empty()) return;
  std::error_code ignored;
  std::filesystem::create_directories(std::filesystem::path(fPath).parent_path(), ignored);
  std::string part = fPath + ".XXXXXX";
  TUniqueFd const file(::mkostemp(part.data(), O_CLOEXEC));
  if (!file) return;
  std::string text = HeadFor(state);
  for (std::string const& record : records) text += HexText(record) + "\n";
  if (!WriteWhole(file.get(), text) || ::rename(part.c_str(), fPath.c_str()) != 0) ::unlink(part.c_str());
}

}  // namespace NQRVZEP20
