// SPDX-License-Identifier: Apache-2.0
#include "TConfig.h"

#include "TOSSpecific.h"
#include "TZEPException.h"
#include "core/Log.h"
#include "os/Settings.h"

#include <exception>
#include <fstream>
#include <memory>
#include <optional>
#include <string_view>
#include <utility>

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

}  // namespace

TConfig* TConfig::cfgInstance = nullptr;

TConfig* TConfig::GetInstance() {
  if (cfgInstance == nullptr) cfgInstance = std::make_unique<TConfig>().release();  // lives until the end of the process
  return cfgInstance;
}

TConfig::TConfig() : fSettings(std::make_unique<TSettings>()), fFileName("zep.cfg") { parseConfigFile(); }

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
  std::string text = LinesOf(file);
  if (file.bad()) {  // a part of the file is not used
    LogError("TConfig::parseConfigFile(): Read config file ", fFileName, " failed");
    return;
  }
  fSettings->Add(std::move(text));
}

std::string TConfig::getValue(std::string const& key) {
  if (fSettings->IsEmpty()) {
    LogError("TConfig::getValue(): map is empty");
    return "";
  }
  std::optional<std::string_view> const value = fSettings->ValueOf(key);
  if (!value) {
    LogError("TConfig::getValue(): key not found");
    return "";
  }
  LogDebug("TConfig::getValue(): key ", key, " found, value is ", *value);
  return std::string(*value);
}

std::vector<std::string> TConfig::listKeys() {
  if (fSettings->IsEmpty()) {
    LogError("TConfig::getValue(): map is empty");  // names getValue, although this is listKeys. Kept.
    return {};
  }
  return fSettings->Keys();
}

}  // namespace NQRVZEP20
