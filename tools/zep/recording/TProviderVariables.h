// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <map>
#include <optional>
#include <string>

namespace NQRVZEP20::zep {

// Sets environment variables for the plug-ins, an empty value unsets one; the destructor restores them.
class TProviderVariables {
public:
  explicit TProviderVariables(std::map<std::string, std::string> const& values);
  ~TProviderVariables();
  TProviderVariables(TProviderVariables const&) = delete;
  TProviderVariables& operator=(TProviderVariables const&) = delete;

private:
  std::map<std::string, std::optional<std::string>> fBefore;
};

}  // namespace NQRVZEP20::zep
