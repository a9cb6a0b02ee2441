// SPDX-License-Identifier: Apache-2.0
#include "TConfig.h"

#include "TOSSpecific.h"
#include "TZEPException.h"
#include "core/Log.h"
#include "os/SettingLine.h"

#include <algorithm>
#include <cstdint>
#include <exception>
#include <fstream>
#include <memory>
#include <string_view>
#include <utility>
#include <vector>

namespace NQRVZEP20 {
namespace {

// A file that disappears between the two checks also counts as missing.
bool HasContents(std::string const& path) {
  try {
    return TOSSpecific::FileExists(path) && TOSSpecific::GetFileSize(path) != 0;
  } catch (TZEPException const&) {
    return false;
  }
}

// All lines, each with a newline, up to the end of the file or to an error, which leaves the stream bad.
std::string LinesOf(std::istream& file) {
  constexpr std::size_t kBlock = 65536;
  std::string text;
  while (file) {
    std::size_t const length = text.size();
    text.resize(length + kBlock);
    file.read(&text[length], kBlock);
    text.resize(length + static_cast<std::size_t>(file.gcount()));
  }
  if (!text.empty() && text.back() != '\n') text += '\n';
  return text;
}

// A setting of the file. The texts are parts of the text that was read.
struct TSetting {
  std::string_view fKey, fValue;
};

std::vector<TSetting> SettingsOf(std::string_view text) {
  std::vector<TSetting> settings;
  settings.reserve(static_cast<std::size_t>(std::count(text.begin(), text.end(), '\n')));
  while (!text.empty()) {
    std::size_t const end = text.find('\n');
    TSettingLine const line = ReadSettingLine(text.substr(0, end));
    text.remove_prefix(end + 1);
    if (line.IsSetting()) settings.push_back({line.fKey, line.fValue});
  }
  return settings;
}

std::size_t LengthOfCommonStart(std::vector<TSetting> const& settings) {
  if (settings.empty()) return 0;
  std::string_view common = settings.front().fKey;
  for (TSetting const& setting : settings) {
    auto const end = std::mismatch(common.begin(), common.end(), setting.fKey.begin(), setting.fKey.end()).first;
    common = common.substr(0, static_cast<std::size_t>(end - common.begin()));
  }
  return common.size();
}

// Eight bytes from a position, as a number with the same order. Bytes after the end are 0.
std::uint64_t WordAt(std::string_view text, std::size_t at) {
  std::uint64_t word = 0;
  for (std::size_t i = at; i < at + 8; ++i) word = word << 8 | (i < text.size() ? static_cast<unsigned char>(text[i]) : 0u);
  return word;
}

// A setting's place in the order of the keys: the sixteen bytes after the start that all keys share, then the whole key, then the
// place in the file. The bytes nearly always decide, and the texts, which are far apart in memory, need not be read: that takes
// half of the time for keys in any order.
struct TPlace {
  std::uint64_t fHead, fSecond;
  TSetting const* fSetting;

  TPlace(TSetting const& setting, std::size_t commonLength)
      : fHead(WordAt(setting.fKey, commonLength)), fSecond(WordAt(setting.fKey, commonLength + 8)), fSetting(&setting) {}

  bool operator<(TPlace const& other) const {
    if (fHead != other.fHead) return fHead < other.fHead;
    if (fSecond != other.fSecond) return fSecond < other.fSecond;
    int const order = fSetting->fKey.compare(other.fSetting->fKey);
    return order != 0 ? order < 0 : fSetting < other.fSetting;
  }
};

bool IsSortedByKey(std::vector<TSetting> const& settings) {
  auto const isBefore = [](TSetting const& left, TSetting const& right) { return left.fKey < right.fKey; };
  return std::is_sorted(settings.begin(), settings.end(), isBefore);
}

// Sorts by key, and settings with the same key in the order of the file.
void SortByKey(std::vector<TSetting>& settings) {
  if (IsSortedByKey(settings)) return;
  std::size_t const commonLength = LengthOfCommonStart(settings);
  std::vector<TPlace> places;
  places.reserve(settings.size());
  for (TSetting const& setting : settings) places.emplace_back(setting, commonLength);
  std::sort(places.begin(), places.end());
  std::vector<TSetting> sorted;
  sorted.reserve(settings.size());
  for (TPlace const& place : places) sorted.push_back(*place.fSetting);
  settings = std::move(sorted);
}

}  // namespace

TConfig* TConfig::cfgInstance = nullptr;

TConfig* TConfig::GetInstance() {
  if (cfgInstance == nullptr) cfgInstance = std::make_unique<TConfig>().release();  // lives until the end of the process
  return cfgInstance;
}

TConfig::TConfig() : fFileName("zep.cfg") { parseConfigFile(); }

TConfig::~TConfig() {
  // The pointer is not cleared. Kept.
  if (this != cfgInstance) std::unique_ptr<TConfig>(cfgInstance).reset();
}

void TConfig::parseConfigFile() {
  LogDebug("TConfig::parseConfigFile(): start to parse config file");
  if (fFileName.empty()) return;
  if (!HasContents(fFileName)) {
    LogError("TConfig::parseConfigFile(): config file doesn't exist");
    return;
  }

  std::ifstream file;
  try {
    file.open(fFileName);
  } catch (std::exception const&) {
    LogError("TConfig::parseConfigFile(): Open config file ", fFileName, " failed");
    return;
  }
  std::string const text = LinesOf(file);
  if (file.bad()) {  // a part of the file is not used
    LogError("TConfig::parseConfigFile(): Read config file ", fFileName, " failed");
    return;
  }
  std::vector<TSetting> settings = SettingsOf(text);
  SortByKey(settings);  // a map inserts sorted settings without a search
  for (TSetting const& setting : settings)
    fSettings.try_emplace(fSettings.end(), std::string(setting.fKey), setting.fValue);  // the first setting of a key is kept
}

std::string TConfig::getValue(std::string const& key) {
  if (fSettings.empty()) {
    LogError("TConfig::getValue(): map is empty");
    return "";
  }
  auto const setting = fSettings.find(key);
  if (setting == fSettings.end()) {
    LogError("TConfig::getValue(): key not found");
    return "";
  }
  LogDebug("TConfig::getValue(): key ", key, " found, value is ", setting->second);
  return setting->second;
}

std::vector<std::string> TConfig::listKeys() {
  if (fSettings.empty()) {
    LogError("TConfig::getValue(): map is empty");  // names getValue, although this is listKeys. Kept.
    return {};
  }
  std::vector<std::string> keys;
  keys.reserve(fSettings.size());
  for (auto const& setting : fSettings) keys.push_back(setting.first);
  return keys;
}

}  // namespace NQRVZEP20
