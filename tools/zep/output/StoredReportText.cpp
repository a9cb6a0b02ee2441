// SPDX-License-Identifier: Apache-2.0
#include "tools/zep/output/StoredReportText.h"

#include "tools/zep/output/SectionText.h"
#include "tools/zep/output/Text.h"

#include <algorithm>

namespace NQRVZEP20::zep {

namespace {

std::string ProblemsAsText(TStoredReport const& report) {
  bool const isAllAsked = std::none_of(report.fRules.begin(), report.fRules.end(),
                                       [](TStoredRule const& rule) { return rule.fOutcome == "not-asked"; });
  if (report.fProblems.empty())
    return std::string("Findings: no problem was found") + (isAllAsked ? "" : " by the rules that could be asked") + "\n";
  TTable table({12, 66});
  table.Add({"Findings", "Problem"});
  for (TStoredProblem const& problem : report.fProblems)
    table.Add({problem.fSeverity,
               problem.fReason + ". " + problem.fRemedy + (problem.fRemedy.empty() ? "(" : " (") + problem.fRule + ")"});
  return table.GetText();
}

std::string RowsAsText(std::string const& title, std::vector<TStoredRow> const& rows) {
  TTable table({15, 36, 25});
  table.Add({title, "Value", "Source"});
  for (TStoredRow const& row : rows) {
    TAnswer<std::string> const& answer = row.fAnswer;
    std::string const value = answer.IsKnown()           ? *answer.fValue
                              : answer.IsNotApplicable() ? "none: " + answer.fMissing.fReason
                                                         : "unknown: " + answer.fMissing.fReason;
    table.Add({row.fLabel, value, answer.fSource.empty() ? "none" : answer.fSource});
  }
  return table.GetText();
}

}  // namespace

std::string StoredReportAsText(TStoredReport const& report) {
  std::string const label = report.fLabel.empty() ? "" : report.fLabel + " ";
  std::string text;
  for (std::string const& line : report.fHead) text += Printable(line) + "\n";
  text += "\n" + ProblemsAsText(report) + "\n" + RowsAsText(label + "Identity", report.fIdentity) + "\n" +
          RowsAsText(label + "Details", report.fDetails);
  for (TReportSection const& section : report.fSections) text += "\n" + SectionAsText(section, label, 0);
  return text;
}

}  // namespace NQRVZEP20::zep
