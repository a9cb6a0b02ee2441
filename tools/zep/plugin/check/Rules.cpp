// SPDX-License-Identifier: Apache-2.0
#include "tools/zep/plugin/check/Rules.h"

namespace NQRVZEP20::zep {

namespace {

constexpr std::size_t kMostIssues = 20;  // kept of each kind

struct TNamedRule {
  char const* fName;
  TRule fRule;
};

constexpr TNamedRule kRules[] = {
    {"name", CheckName},
    {"load", CheckLoad},
    {"undefined-symbols", CheckUndefinedSymbols},
    {"exports", CheckExports},
    {"static-construction", CheckStaticConstruction},
    {"registration", CheckRegistration},
    {"fill", CheckFill},
    {"fill-differs", CheckFillDiffers},
    {"keys", CheckKeys},
    {"text", CheckText},
    {"types", CheckTypes},
    {"schema", CheckSchema},
    {"time-and-memory", CheckTimeAndMemory},
    {"left-behind", CheckLeftBehind},
    {"output", CheckOutput},
};

}  // namespace

void TRuleResult::Find(std::string const& place, std::string const& text, std::string const& remedy) {
  if (++fNumberFound <= kMostIssues) fFindings.push_back({place, text, remedy});
}

void TRuleResult::Note(std::string const& place, std::string const& text) {
  if (++fNumberNoted <= kMostIssues) fNotes.push_back({place, text, ""});
}

std::string TRuleResult::Status() const {
  if (HasFound()) return "found";
  return fWhyNotChecked.empty() ? "passed" : "not-checked";
}

std::vector<TRuleResult> CheckRules(TObservation const& observation) {
  std::vector<TRuleResult> results;
  for (TNamedRule const& rule : kRules) rule.fRule(observation, results.emplace_back(rule.fName));
  return results;
}

}  // namespace NQRVZEP20::zep
