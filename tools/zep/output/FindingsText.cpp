// SPDX-License-Identifier: Apache-2.0
#include "tools/zep/output/FindingsText.h"

#include "tools/zep/output/Output.h"
#include "tools/zep/output/Text.h"
#include "tools/zep/secrets/Secrets.h"

#include <algorithm>

namespace NQRVZEP20::zep {

namespace {

using EOutcome = TRuleResult::EOutcome;

constexpr std::size_t kIndent = 13;  // the width of "information" and two blanks

// "2 errors"
std::string CountedProblems(std::size_t count, std::string const& severity) {
  bool const hasPlural = severity == "warning" || severity == "error";
  return std::to_string(count) + " " + severity + (hasPlural && count != 1 ? "s" : "");
}

std::string Paragraph(std::string const& text) { return Joined(Wrapped(Printable(text), OutputWidth()), "\n") + "\n"; }

// The text in lines that begin at the same column; `head` stands before the first.
std::string Indented(std::string const& head, std::string const& text) {
  std::size_t const width = OutputWidth() > 2 * kIndent ? OutputWidth() - kIndent : kIndent;
  std::string lines;
  for (std::string const& line : Wrapped(Printable(MessageWithoutSecrets(text)), width)) {
    std::string const before = lines.empty() ? head : "";
    lines += before + std::string(kIndent - before.size(), ' ') + line + "\n";
  }
  return lines;
}

std::string AskedText(TFindings const& findings) {
  auto const [asked, withNothing, notAsked] = findings.CountRules();
  return std::to_string(asked) + (asked == 1 ? " rule asked" : " rules asked") +
         (withNothing == 0 ? "" : ", " + std::to_string(withNothing) + " had nothing to examine") +
         (notAsked == 0 ? "" : ", " + std::to_string(notAsked) + " could not be asked");
}

// The thresholds that the settings have changed; empty if there are none.
std::string ChangedThresholds(TFindings const& findings) {
  auto const defaults = TThresholds().Settings(), settings = findings.fThresholds.Settings();
  std::string text;
  for (std::size_t i = 0; i < settings.size(); ++i)
    if (settings[i] != defaults[i])
      text += (text.empty() ? "" : ", ") + settings[i].first + "=" + std::to_string(settings[i].second);
  return text;
}

// The rules that could not be asked, grouped by the reason: "disk-failing, disk-worn: only root may read it".
std::vector<std::string> ReasonsOf(TFindings const& findings) {
  std::vector<std::pair<std::string, std::string>> groups;  // a reason, and the rules
  for (TRuleResult const& rule : findings.fRules) {
    if (rule.fOutcome != EOutcome::kNotAsked) continue;
    std::string const& reason = rule.fNotAsked.front().fReason;
    auto const group = std::find_if(groups.begin(), groups.end(), [&](auto const& each) { return each.first == reason; });
    if (group == groups.end())
      groups.emplace_back(reason, rule.fId);
    else
      group->second += ", " + rule.fId;
  }
  std::vector<std::string> texts;
  for (auto const& [reason, rules] : groups) texts.push_back(rules + ": " + reason);
  return texts;
}

std::string OutcomeText(TStoredRule const& rule) {
  if (rule.fHasNothingToExamine) return "nothing to examine";
  std::string const reason = rule.fNotExamined.empty() ? "" : ": " + rule.fNotExamined.front().fReason;
  if (rule.fOutcome == "not-asked") return "not asked" + reason;
  if (rule.fOutcome == "wrong" || reason.empty()) return rule.fOutcome;
  return "fine, but " + std::to_string(rule.fNotExamined.size()) + " not examined" + reason;
}

}  // namespace

std::string CountsOf(TFindings const& findings) {
  std::vector<TStoredProblem> problems;
  for (TProblem const& problem : findings.fProblems) problems.push_back({"", NameOf(problem.fSeverity), "", "", ""});
  return CountsOf(problems);
}

std::string CountsOf(std::vector<TStoredProblem> const& problems) {
  std::string text;
  for (char const* severity : {"critical", "error", "warning", "information"}) {
    auto const count = std::count_if(problems.begin(), problems.end(),
                                     [&](TStoredProblem const& problem) { return problem.fSeverity == severity; });
    if (count > 0) text += (text.empty() ? "" : ", ") + CountedProblems(static_cast<std::size_t>(count), severity);
  }
  return text.empty() ? "nothing wrong" : text;
}

std::string FindingsAsText(TFindings const& findings, std::string const& label) {
  std::string text = Paragraph(label + "Findings: " + CountsOf(findings) + " (" + AskedText(findings) + ")");
  for (TProblem const& problem : findings.fProblems)
    text += Indented(NameOf(problem.fSeverity), problem.fReason + ".") + Indented("", problem.fRemedy);
  for (std::string const& reason : ReasonsOf(findings)) text += Indented("not asked", reason);
  if (std::string const changed = ChangedThresholds(findings); !changed.empty())
    text += Indented("thresholds", "set in zep.cfg: " + changed);
  return text;
}

std::string RulesAsText(TFindings const& findings, std::string const& label) {
  std::vector<TStoredRule> rules;
  for (TRuleResult const& rule : findings.fRules) {
    rules.push_back({rule.fId, rule.fTitle, NameOf(rule.fOutcome), rule.HasNothingToExamine(), {}});
    for (auto const& notAsked : rule.fNotAsked) rules.back().fNotExamined.push_back({notAsked.fInstance, notAsked.fReason});
  }
  return RulesAsText(rules, label);
}

std::string RulesAsText(std::vector<TStoredRule> const& rules, std::string const& label) {
  TTable table({22, 34, 20});
  table.Add({label + "Rule", "Question", "Answer"});
  for (TStoredRule const& rule : rules) table.Add({rule.fId, rule.fQuestion, MessageWithoutSecrets(OutcomeText(rule))});
  return table.GetText();
}

}  // namespace NQRVZEP20::zep
