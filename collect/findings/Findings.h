// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "collect/PlugIns.h"
#include "collect/findings/TRule.h"

#include <optional>
#include <string>
#include <vector>

namespace NQRVZEP20 {

// The answer of one rule.
struct TRuleResult {
  enum class EOutcome {
    kFine,      // nothing is wrong with what could be examined; there may be nothing to examine on this machine
    kWrong,     // it found a problem
    kNotAsked,  // nothing could be examined
  };

  std::string fId;
  std::string fTitle;
  EOutcome fOutcome;
  std::size_t fExamined;             // the number of values examined
  std::vector<TNotAsked> fNotAsked;  // may also be there when other elements were examined

  // Whether this machine has nothing that the rule judges, such as a RAID array. The outcome is kFine then.
  bool HasNothingToExamine() const { return fOutcome == EOutcome::kFine && fExamined == 0; }
};

// Each rule is counted in one of them.
struct TRuleCounts {
  std::size_t fAsked, fWithNothingToExamine, fNotAsked;
};

// What is wrong with this machine.
struct TFindings {
  std::vector<TProblem> fProblems;  // the worst first, then in the order of the rules
  TThresholds fThresholds;          // that the rules used
  std::vector<TRuleResult> fRules;  // in the order of the rules

  // The highest severity of the problems; none without problems.
  std::optional<ESeverity> Worst() const;
  std::size_t CountOf(TRuleResult::EOutcome outcome) const;
  TRuleCounts CountRules() const;
};

// For programs: "fine", "wrong" and "not-asked".
std::string NameOf(TRuleResult::EOutcome outcome);

// The rules of this library, in a fixed order. A front end may add its own.
std::vector<TRule> StandardRules();

// Those of them that a management controller can answer alone.
std::vector<TRule> ControllerRules();

// Asks every rule. A rule that throws, or whose provider throws, counts as not asked, with the reason; the problems that it has
// found until then are kept. Blocks while the rules read the namespaces. Use the views from no other thread meanwhile.
TFindings MakeFindings(std::vector<TNamespaceView> const& views, TThresholds const& thresholds = {},
                       std::vector<TRule> const& rules = StandardRules());

}  // namespace NQRVZEP20
