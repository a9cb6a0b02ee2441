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
  std::string text;
  for (std::string line; std::getline(file, line);) text.append(line) += '\n';
  return text;
}

// A setting of the file. The texts are parts of the text that was read.
struct TSetting {
  std::string_view fKey, fValue;
  std::uint64_t fHead = 0;  // see SortByKey
};

std::vector<TSetting> SettingsOf(std::string_view text) {
  std::vector<TSetting> settings;
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

// The first eight bytes, as a number with the same order.
std::uint64_t HeadOf(std::string_view text) {
  std::uint64_t head = 0;
  for (std::size_t i = 0; i < 8; ++i) head = head << 8 | (i < text.size() ? static_cast<unsigned char>(text[i]) : 0u);
  return head;
}

// Sorts by key, and settings with the same key in the order of the file. The eight bytes after the start that all keys share are
// compared first, as one number: they nearly always decide, and the texts, which are far apart in memory, need not be read.
void SortByKey(std::vector<TSetting>& settings) {
  std::size_t const commonLength = LengthOfCommonStart(settings);
  for (TSetting& setting : settings) setting.fHead = HeadOf(setting.fKey.substr(commonLength));
  auto const isBefore = [](TSetting const& left, TSetting const& right) {
    return left.fHead != right.fHead ? left.fHead < right.fHead : left.fKey < right.fKey;
  };
  if (!std::is_sorted(settings.begin(), settings.end(), isBefore)) std::stable_sort(settings.begin(), settings.end(), isBefore);
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
