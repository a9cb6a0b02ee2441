// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <regex>
#include <string>

namespace NQRVZEP20::zep {

// A document without the collector's own timing.
inline std::string WithoutTiming(std::string const& document) {
  std::string const timed = std::regex_replace(document, std::regex("\"time\": \"[^\"]*\""), "\"time\": N");
  return std::regex_replace(timed, std::regex("\"milliseconds\": [0-9.e+-]+"), "\"milliseconds\": N");
}

}  // namespace NQRVZEP20::zep
