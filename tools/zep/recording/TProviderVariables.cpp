// SPDX-License-Identifier: Apache-2.0
#include "tools/zep/recording/TProviderVariables.h"

#include <cstdlib>

namespace NQRVZEP20::zep {

TProviderVariables::TProviderVariables(std::map<std::string, std::string> const& values) {
  for (auto const& [name, value] : values) {
    char const* const before = std::getenv(name.c_str());
    fBefore[name] = before != nullptr ? std::optional<std::string>(before) : std::nullopt;
    if (value.empty())
      ::unsetenv(name.c_str());
    else
      ::setenv(name.c_str(), value.c_str(), 1);
  }
}

TProviderVariables::~TProviderVariables() {
  for (auto const& [name, value] : fBefore) {
    if (value)
      ::setenv(name.c_str(), value->c_str(), 1);
    else
      ::unsetenv(name.c_str());
  }
}

}  // namespace NQRVZEP20::zep
