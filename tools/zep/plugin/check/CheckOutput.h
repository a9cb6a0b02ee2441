// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "tools/zep/output/Json.h"
#include "tools/zep/plugin/check/Rules.h"

#include <string>
#include <vector>

namespace NQRVZEP20::zep {

// "found: keys (2), text (1)"; empty when no rule has found anything.
std::string SummaryOf(std::vector<TRuleResult> const& results);

// The table of the rules and that of the time and memory.
std::string CheckAsText(TObservation const& observation, std::vector<TRuleResult> const& results);

// The document of zep plugin check (docs/formats.md).
TJson CheckAsJson(TObservation const& observation, std::vector<TRuleResult> const& results);

}  // namespace NQRVZEP20::zep
