// SPDX-License-Identifier: Apache-2.0
#include "collect/findings/Rules.h"

namespace NQRVZEP20 {

namespace {

std::string TextOr(TElement const& element, char const* property, std::string const& otherwise) {
  auto const text = element.Text(property);
  return text.IsKnown() ? *text.fValue : otherwise;
}

void AskPlugIns(TRuleRun& run) {
  for (TElement const& finding : run.TryElements("ZEP_Finding")) {
    auto const name = finding.Text("Severity"), reason = finding.Text("Reason");
    if (!run.Know(finding, name) || !run.Know(finding, reason)) continue;
    auto const severity = SeverityFrom(*name.fValue);
    if (!severity)
      run.NoteNotAsked({"\"" + *name.fValue + "\" is not a severity", finding.Path()});
    else
      run.Add({TextOr(finding, "Rule", ""), *severity, *reason.fValue, TextOr(finding, "Remedy", ""),
               TextOr(finding, "Element", finding.Path()), reason.fSource});
  }
}

}  // namespace

std::vector<TRule> PlugInRules() { return {{"plug-in", "Has a plug-in found a problem?", AskPlugIns}}; }

}  // namespace NQRVZEP20
