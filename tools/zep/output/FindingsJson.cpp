// SPDX-License-Identifier: Apache-2.0
#include "tools/zep/output/FindingsJson.h"

namespace NQRVZEP20::zep {

namespace {

TJson ProblemAsJson(TProblem const& problem) {
  return {{"rule", problem.fRule},
          {"severity", NameOf(problem.fSeverity)},
          {"reason", problem.fReason},
          {"remedy", OrNull(problem.fRemedy)},
          {"instance", OrNull(problem.fInstance)},
          {"source", OrNull(problem.fSource)}};
}

TJson RuleAsJson(TRuleResult const& rule) {
  TJson notExamined = TJson::array();
  for (TNotAsked const& element : rule.fNotAsked)
    notExamined.push_back({{"instance", OrNull(element.fInstance)}, {"reason", element.fReason}});
  return {{"id", rule.fId},
          {"question", rule.fTitle},
          {"outcome", NameOf(rule.fOutcome)},
          {"examined", rule.fExamined},
          {"notExamined", notExamined}};
}

}  // namespace

TJson FindingsAsJson(TFindings const& findings) {
  TJson problems = TJson::array(), rules = TJson::array();
  for (TProblem const& problem : findings.fProblems) problems.push_back(ProblemAsJson(problem));
  for (TRuleResult const& rule : findings.fRules) rules.push_back(RuleAsJson(rule));
  TJson thresholds = TJson::object();
  for (auto const& [key, value] : findings.fThresholds.Settings()) thresholds[key] = value;
  auto const worst = findings.Worst();
  auto const [asked, withNothing, notAsked] = findings.CountRules();
  return {{"worst", worst ? TJson(NameOf(*worst)) : TJson(nullptr)},
          {"problems", problems},
          {"rules", rules},
          {"counts", {{"asked", asked}, {"nothingToExamine", withNothing}, {"notAsked", notAsked}}},
          {"thresholds", thresholds}};
}

}  // namespace NQRVZEP20::zep
