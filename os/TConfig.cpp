#include "TConfig.h"

#include "TOSSpecific.h"
#include "TZEPException.h"
#include "core/Log.h"

#include <exception>
#include <fstream>
#include <memory>

namespace NQRVZEP20 {
namespace {

// A file that goes away between the two questions is missing as well.
bool HasContents(std::string const& path) {
  try {
    return TOSSpecific::FileExists(path) && TOSSpecific::GetFileSize(path) != 0;
  } catch (TZEPException const&) {
    return false;
  }
}

bool IsComment(std::string const& line) { return !line.empty() && line.front() == '#'; }

// Of two lines with one key the first counts.
void AddLine(std::string const& line, std::map<std::string, std::string>& settings) {
  if (IsComment(line)) return;
  // Without "=" the value starts where the line does: a bare word maps to itself. Kept.
  std::size_t const equals = line.find('=');
  std::string key = line.substr(0, equals);
  std::string value = line.substr(equals + 1);
  if (key.empty() || value.empty()) return;
  settings.emplace(std::move(key), std::move(value));
}

}  // namespace

TConfig* TConfig::cfgInstance = nullptr;

TConfig* TConfig::GetInstance() {
  if (cfgInstance == nullptr) cfgInstance = std::make_unique<TConfig>().release();  // lives to the end of the process
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
  for (std::string line; std::getline(file, line);) AddLine(line, fSettings);
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
    LogError("TConfig::getValue(): map is empty");  // names getValue here too. Kept.
    return {};
  }
  std::vector<std::string> keys;
  keys.reserve(fSettings.size());
  for (auto const& setting : fSettings) keys.push_back(setting.first);
  return keys;
}

}  // namespace NQRVZEP20
