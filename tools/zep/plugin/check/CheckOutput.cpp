// SPDX-License-Identifier: Apache-2.0
#include "tools/zep/plugin/check/CheckOutput.h"

#include "tools/zep/output/Text.h"
#include "tools/zep/secrets/Secrets.h"

#include <cstdio>
#include <utility>

namespace NQRVZEP20::zep {

namespace {

// ---- Text ----

std::string TextOf(TIssue const& issue) {
  return issue.fPlace + ": " + issue.fText + (issue.fRemedy.empty() ? "" : ". Remedy: " + issue.fRemedy);
}

void AddMore(TTable& table, std::size_t number, std::size_t shown, std::string const& kind) {
  if (number > shown) table.Add({"", "", "and " + std::to_string(number - shown) + " more " + kind});
}

// The status is in the first row; there is a row for each finding and each note.
void AddTo(TTable& table, TRuleResult const& result) {
  std::string rule = result.Rule(), status = result.Status();
  auto const add = [&](std::string const& text) { table.Add({std::exchange(rule, ""), std::exchange(status, ""), text}); };
  for (TIssue const& finding : result.Findings()) add(TextOf(finding));
  AddMore(table, result.NumberFound(), result.Findings().size(), "findings");
  bool const isPlain = !result.HasFound() && result.Notes().empty();
  if (isPlain || !result.WhyNotChecked().empty()) add(result.WhyNotChecked());
  for (TIssue const& note : result.Notes()) add("Note: " + TextOf(note));
  AddMore(table, result.NumberNoted(), result.Notes().size(), "notes");
}

std::string TimeText(double milliseconds) {
  char text[32];
  std::snprintf(text, sizeof text, "%.1f ms", milliseconds);
  return text;
}

std::string FiguresAsText(TPlugIn const& plugIn) {
  TTable table({32, 10, 12, 12});
  table.Add({"Step", "Instances", "Time", "Memory"});
  table.Add({"load", "", TimeText(plugIn.fMilliseconds), SizeText(plugIn.fPeakBytes)});
  for (TProviderRun const& run : plugIn.fProviders) {
    if (!run.fView) continue;
    table.Add({"fill " + run.fView->GetName(), "", TimeText(run.fMilliseconds), SizeText(run.fPeakBytes)});
    for (TClassCost const& cost : run.fCosts)
      table.Add(
          {"read " + cost.fClass, std::to_string(cost.fInstances), TimeText(cost.fMilliseconds), SizeText(cost.fPeakBytes)});
  }
  return table.GetText();
}

// ---- Document ----

TJson AsJson(TIssue const& issue) { return {{"place", issue.fPlace}, {"text", issue.fText}, {"remedy", OrNull(issue.fRemedy)}}; }

TJson AsJson(std::vector<TIssue> const& issues) {
  TJson json = TJson::array();
  for (TIssue const& issue : issues) json.push_back(AsJson(issue));
  return json;
}

TJson AsJson(TRuleResult const& result) {
  bool const isChecked = result.Status() != "not-checked";
  return {{"id", result.Rule()},
          {"status", result.Status()},
          {"whyNotChecked", isChecked ? TJson(nullptr) : TJson(result.WhyNotChecked())},
          {"found", result.NumberFound()},
          {"findings", AsJson(result.Findings())},
          {"noted", result.NumberNoted()},
          {"notes", AsJson(result.Notes())}};
}

TJson AsJson(TClassCost const& cost) {
  return {{"name", cost.fClass},
          {"instances", cost.fInstances},
          {"milliseconds", cost.fMilliseconds},
          {"peakBytes", cost.fPeakBytes}};
}

TJson AsJson(TProviderRun const& run) {
  TJson classes = TJson::array();
  for (TClassCost const& cost : run.fCosts) classes.push_back(AsJson(cost));
  return {{"name", run.fName},
          {"namespace", run.fView ? TJson(run.fView->GetName()) : TJson(nullptr)},
          {"milliseconds", run.fMilliseconds},
          {"peakBytes", run.fPeakBytes},
          {"classes", classes}};
}

TJson FiguresAsJson(TPlugIn const& plugIn) {
  TJson providers = TJson::array();
  for (TProviderRun const& run : plugIn.fProviders) providers.push_back(AsJson(run));
  return {{"milliseconds", plugIn.fMilliseconds}, {"peakBytes", plugIn.fPeakBytes}, {"providers", providers}};
}

}  // namespace

std::string SummaryOf(std::vector<TRuleResult> const& results) {
  std::vector<std::string> found;
  for (TRuleResult const& result : results)
    if (result.HasFound()) found.push_back(result.Rule() + " (" + std::to_string(result.NumberFound()) + ")");
  return found.empty() ? "" : "found: " + Joined(found, ", ");
}

std::string CheckAsText(TObservation const& observation, std::vector<TRuleResult> const& results) {
  TTable table({20, 11, 45});
  table.Add({"Rule", "Result", "Finding"});
  for (TRuleResult const& result : results) AddTo(table, result);
  std::string const schema = observation.fSchemaFile.empty() ? "none" : MessageWithoutSecrets(observation.fSchemaFile);
  std::string const head = "Plug-in: " + observation.fFile.fFile + "\nSchema: " + schema + "\n\n";
  bool const hasFigures = observation.WhyNotLoaded().empty();
  return head + table.GetText() + (hasFigures ? "\n" + FiguresAsText(observation.fFirst.fPlugIn) : "");
}

TJson CheckAsJson(TObservation const& observation, std::vector<TRuleResult> const& results) {
  std::string const summary = SummaryOf(results);
  TJson document = DocumentHead("zep plugin check", summary.empty() ? kExitComplete : kExitNothing, summary);
  document["file"] = observation.fFile.fFile;
  document["plugIn"] = observation.fFile.fName;
  document["schema"] = OrNull(MessageWithoutSecrets(observation.fSchemaFile));
  document["rules"] = TJson::array();
  for (TRuleResult const& result : results) document["rules"].push_back(AsJson(result));
  document["figures"] = FiguresAsJson(observation.fFirst.fPlugIn);
  return document;
}

}  // namespace NQRVZEP20::zep
