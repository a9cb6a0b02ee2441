// SPDX-License-Identifier: Apache-2.0
#include "collect/findings/ESeverity.h"

#include <cstddef>
#include <iterator>

namespace NQRVZEP20 {

namespace {

constexpr char const* kNames[] = {"information", "warning", "error", "critical"};

}  // namespace

std::string NameOf(ESeverity severity) { return kNames[static_cast<std::size_t>(severity)]; }

std::optional<ESeverity> SeverityFrom(std::string const& name) {
  for (std::size_t i = 0; i < std::size(kNames); ++i)
    if (name == kNames[i]) return static_cast<ESeverity>(i);
  return std::nullopt;
}

}  // namespace NQRVZEP20
