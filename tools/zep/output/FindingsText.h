// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "collect/findings/Findings.h"

#include <string>

namespace NQRVZEP20::zep {

// The problems, each with its remedy below it, and the rules that could not be asked. `label`: the label of the sample and a
// blank; empty without a sample.
std::string FindingsAsText(TFindings const& findings, std::string const& label);

// A table of all rules: what each found, or why it could not be asked.
std::string RulesAsText(TFindings const& findings, std::string const& label);

// "2 errors, 1 warning", or "nothing wrong".
std::string CountsOf(TFindings const& findings);

}  // namespace NQRVZEP20::zep
