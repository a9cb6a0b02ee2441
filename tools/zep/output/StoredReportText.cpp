// SPDX-License-Identifier: Apache-2.0
#include "tools/zep/output/StoredReportText.h"

#include "MissingValueClass.h"
#include "tools/zep/output/FindingsText.h"
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

std::string ProvidersAsText(std::string const& title, std::vector<TStoredProvider> const& providers) {
  TTable table({15, 61});
  table.Add({title, "Result"});
  for (TStoredProvider const& provider : providers)
    table.Add({provider.fPlugIn, provider.fError.empty() ? "filled " + provider.fNamespace : "failed: " + provider.fError});
  return table.GetText();
}

std::string StoredInstanceAsText(TStoredInstance const& instance) {
  TTable table({24, 10, 42});
  table.Add({"Property", "Type", "Value"});
  for (TStoredProperty const& property : instance.fProperties)
    table.Add({property.fName, property.fType, property.IsKnown() ? property.fText : "NULL: " + property.fMissing.fReason});
  return Printable(instance.fPath) + "\n\n" + table.GetText();
}

// Reasons are printed at the values that are missing.
std::string InstancesAsText(std::vector<TStoredInstance> const& instances) {
  std::string text;
  for (TStoredInstance const& instance : instances)
    if (instance.fClass != kMissingValueClass) text += "\n" + StoredInstanceAsText(instance);
  return text;
}

}  // namespace

std::string StoredReportAsText(TStoredReport const& report, TReportParts const& parts) {
  auto const isNamed = [&](std::string const& name) {
    return std::find(parts.fSections.begin(), parts.fSections.end(), name) != parts.fSections.end();
  };
  auto const isWanted = [&](std::string const& name) { return parts.fSections.empty() || isNamed(name); };
  std::string const label = report.fLabel.empty() ? "" : report.fLabel + " ";
  std::string text;
  for (std::string const& line : report.fHead) text += Printable(line) + "\n";
  if (isWanted(kFindingsPart)) text += "\n" + ProblemsAsText(report);
  if (isNamed(kFindingsPart)) text += "\n" + RulesAsText(report.fRules, label);
  if (isWanted(kIdentityPart)) text += "\n" + RowsAsText(label + "Identity", report.fIdentity);
  if (isWanted(kDetailsPart)) text += "\n" + RowsAsText(label + "Details", report.fDetails);
  for (TReportSection const& section : report.fSections)
    if (isWanted(section.fKey)) text += "\n" + SectionAsText(section, label, 0);
  if (isNamed(kPlugInsPart)) text += "\n" + ProvidersAsText(label + "Plug-in", report.fProviders);
  return parts.fAllInstances ? text + InstancesAsText(report.fInstances) : text;
}

}  // namespace NQRVZEP20::zep
