// SPDX-License-Identifier: Apache-2.0
#include "collect/findings/Findings.h"

#include "collect/FailureOf.h"
#include "collect/findings/Rules.h"

#include <algorithm>

namespace NQRVZEP20 {

namespace {

using EOutcome = TRuleResult::EOutcome;

EOutcome OutcomeOf(TRuleRun const& run) {
  if (!run.GetProblems().empty()) return EOutcome::kWrong;
  return run.GetExamined() > 0 || run.GetNotAsked().empty() ? EOutcome::kFine : EOutcome::kNotAsked;
}

void Ask(TRule const& rule, TRuleRun& run) {
  std::string const failure = FailureOf([&] { rule.fAsk(run); });
  if (!failure.empty()) run.NoteNotAsked({"the rule failed: " + failure, ""});
}

}  // namespace

std::optional<ESeverity> TFindings::Worst() const {
  return fProblems.empty() ? std::nullopt : std::optional(fProblems.front().fSeverity);
}

std::size_t TFindings::CountOf(TRuleResult::EOutcome outcome) const {
  return std::count_if(fRules.begin(), fRules.end(), [&](TRuleResult const& rule) { return rule.fOutcome == outcome; });
}

TRuleCounts TFindings::CountRules() const {
  auto const idle = static_cast<std::size_t>(
      std::count_if(fRules.begin(), fRules.end(), [](TRuleResult const& rule) { return rule.HasNothingToExamine(); }));
  std::size_t const notAsked = CountOf(EOutcome::kNotAsked);
  return {fRules.size() - idle - notAsked, idle, notAsked};
}

std::string NameOf(TRuleResult::EOutcome outcome) {
  switch (outcome) {
    case EOutcome::kFine:
      return "fine";
    case EOutcome::kWrong:
      return "wrong";
    default:
      return "not-asked";
  }
}

std::vector<TRule> StandardRules() {
  std::vector<TRule> rules;
  for (auto const part : {StorageRules, FileSystemRules, NetworkRules, DeviceRules, SensorRules, LogRules,
                          ManagementControllerRules, HostRules, SystemRules, PlugInRules})
    for (TRule& rule : part()) rules.push_back(std::move(rule));
  return rules;
}

TFindings MakeFindings(std::vector<TNamespaceView> const& views, TThresholds const& thresholds, std::vector<TRule> const& rules) {
  TFindings findings;
  findings.fThresholds = thresholds;
  for (TRule const& rule : rules) {
    TRuleRun run(views, thresholds);
    Ask(rule, run);
    findings.fRules.push_back({rule.fId, rule.fTitle, OutcomeOf(run), run.GetExamined(), run.GetNotAsked()});
    for (TProblem problem : run.GetProblems()) {
      if (problem.fRule.empty()) problem.fRule = rule.fId;
      findings.fProblems.push_back(std::move(problem));
    }
  }
  std::stable_sort(findings.fProblems.begin(), findings.fProblems.end(),
                   [](TProblem const& one, TProblem const& other) { return one.fSeverity > other.fSeverity; });
  return findings;
}

}  // namespace NQRVZEP20
