// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "collect/findings/Findings.h"
#include "collect/stored/StoredReport.h"

#include <string>
#include <vector>

namespace NQRVZEP20::zep {

// The problems, each with its remedy below it, and the rules that could not be asked. `label`: the label of the sample and a
// blank; empty without a sample.
std::string FindingsAsText(TFindings const& findings, std::string const& label);

// A table of all rules: what each found, or why it could not be asked.
std::string RulesAsText(TFindings const& findings, std::string const& label);
std::string RulesAsText(std::vector<TStoredRule> const& rules, std::string const& label);

// "2 errors, 1 warning", or "nothing wrong".
std::string CountsOf(TFindings const& findings);
std::string CountsOf(std::vector<TStoredProblem> const& problems);

}  // namespace NQRVZEP20::zep
