// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "tools/zep/plugin/check/Observation.h"

#include <cstddef>
#include <string>
#include <vector>

namespace NQRVZEP20::zep {

// The findings of one rule.
class TRuleResult {
public:
  explicit TRuleResult(std::string rule) : fRule(std::move(rule)) {}

  // Only the first findings, and the first notes, are kept.
  void Find(std::string const& place, std::string const& text, std::string const& remedy = "");
  void Note(std::string const& place, std::string const& text);  // information; not a finding
  void CannotCheck(std::string const& why) { fWhyNotChecked = why; }

  std::string const& Rule() const { return fRule; }
  std::string Status() const;  // "passed", "found" or "not-checked"
  bool HasFound() const { return fNumberFound > 0; }
  std::size_t NumberFound() const { return fNumberFound; }
  std::size_t NumberNoted() const { return fNumberNoted; }
  std::vector<TIssue> const& Findings() const { return fFindings; }
  std::vector<TIssue> const& Notes() const { return fNotes; }
  std::string const& WhyNotChecked() const { return fWhyNotChecked; }  // empty when it was checked

private:
  std::string fRule;
  std::vector<TIssue> fFindings, fNotes;
  std::size_t fNumberFound = 0, fNumberNoted = 0;
  std::string fWhyNotChecked;
};

// The results of all rules, in the order of docs/zep.md.
std::vector<TRuleResult> CheckRules(TObservation const& observation);

// ---- The rules ----

using TRule = void (*)(TObservation const& observation, TRuleResult& result);

// Of the file and its way into a process (LoadRules.cpp)
void CheckName(TObservation const& observation, TRuleResult& result);
void CheckLoad(TObservation const& observation, TRuleResult& result);
void CheckUndefinedSymbols(TObservation const& observation, TRuleResult& result);
void CheckExports(TObservation const& observation, TRuleResult& result);
void CheckStaticConstruction(TObservation const& observation, TRuleResult& result);
void CheckRegistration(TObservation const& observation, TRuleResult& result);

// Of the process that fills the namespaces (FillRules.cpp)
void CheckFill(TObservation const& observation, TRuleResult& result);
void CheckTimeAndMemory(TObservation const& observation, TRuleResult& result);
void CheckLeftBehind(TObservation const& observation, TRuleResult& result);
void CheckOutput(TObservation const& observation, TRuleResult& result);

// Of the namespaces (ContentRules.cpp, DifferenceRule.cpp, SchemaRule.cpp, TypeRule.cpp)
void CheckKeys(TObservation const& observation, TRuleResult& result);
void CheckText(TObservation const& observation, TRuleResult& result);
void CheckTypes(TObservation const& observation, TRuleResult& result);
void CheckFillDiffers(TObservation const& observation, TRuleResult& result);
void CheckSchema(TObservation const& observation, TRuleResult& result);

}  // namespace NQRVZEP20::zep
