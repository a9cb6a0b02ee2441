// SPDX-License-Identifier: Apache-2.0
#include "tools/zep/commands/Thresholds.h"

#include "TConfig.h"
#include "TOSSpecific.h"
#include "tools/zep/output/Failure.h"

#include <algorithm>
#include <stdexcept>

namespace NQRVZEP20::zep {

namespace {

// The library logs a missing or empty file as an error, so it is not read then.
std::string SettingOf(std::string const& key) {
  constexpr char const* file = "zep.cfg";
  if (!TOSSpecific::FileExists(file) || TOSSpecific::GetFileSize(file) == 0) return "";
  auto const keys = TConfig::GetInstance()->listKeys();
  return std::find(keys.begin(), keys.end(), key) != keys.end() ? TConfig::GetInstance()->getValue(key) : "";
}

}  // namespace

TThresholds ThresholdSettings() {
  try {
    return TThresholds::From(SettingOf);
  } catch (std::invalid_argument const& failure) {
    throw TWrongUsage(std::string(failure.what()) + " (zep.cfg)");
  }
}

}  // namespace NQRVZEP20::zep
