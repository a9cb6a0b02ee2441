// SPDX-License-Identifier: Apache-2.0
#include "tools/zep/output/DifferencesText.h"

#include "tools/zep/output/Text.h"
#include "tools/zep/secrets/Secrets.h"

#include <algorithm>

namespace NQRVZEP20::zep {

namespace {

using EKind = TObjectDifference::EKind;

std::string TextOf(TChange const& change) { return change.fName + ": " + change.fBefore + " -> " + change.fAfter; }

std::string TextOf(TObjectDifference const& object) {
  std::vector<std::string> changes;
  for (TChange const& change : object.fChanges) changes.push_back(TextOf(change));
  return NameOf(object.fKind) + ": " + object.fClass + " " + object.fName + (changes.empty() ? "" : ": " + Joined(changes, "; "));
}

TJson AsJson(std::vector<TChange> const& changes) {
  TJson json = TJson::array();
  for (TChange const& change : changes)
    json.push_back({{"name", change.fName}, {"before", change.fBefore}, {"after", change.fAfter}});
  return json;
}

TJson AsJson(std::vector<TStoredProblem> const& problems) {
  TJson json = TJson::array();
  for (TStoredProblem const& problem : problems)
    json.push_back({{"rule", problem.fRule},
                    {"severity", problem.fSeverity},
                    {"reason", problem.fReason},
                    {"remedy", OrNull(problem.fRemedy)},
                    {"instance", OrNull(problem.fInstance)}});
  return json;
}

TJson AsJson(std::vector<TChangedProblem> const& problems) {
  TJson json = TJson::array();
  for (auto const& [before, problem] : problems)
    json.push_back({{"rule", problem.fRule},
                    {"before", before},
                    {"after", problem.fSeverity},
                    {"reason", problem.fReason},
                    {"remedy", OrNull(problem.fRemedy)},
                    {"instance", OrNull(problem.fInstance)}});
  return json;
}

// The reasons contain names of files, which were arguments.
std::vector<std::string> NotCompared(TDifferences const& differences) {
  std::vector<std::string> reasons;
  for (std::string const& reason : differences.fNotCompared) reasons.push_back(MessageWithoutSecrets(reason));
  return reasons;
}

TJson SideAsJson(TStoredReport const& report) {
  return {{"file", MessageWithoutSecrets(report.fFile)}, {"time", OrNull(report.fTime)}};
}

}  // namespace

std::string DifferencesAsText(TDifferences const& differences) {
  std::vector<std::string> lines;
  for (TStoredProblem const& problem : differences.fNewProblems)
    lines.push_back("new problem: " + problem.fSeverity + ": " + problem.fReason);
  for (TStoredProblem const& problem : differences.fSolvedProblems)
    lines.push_back("solved problem: " + problem.fSeverity + ": " + problem.fReason);
  for (auto const& [before, problem] : differences.fChangedProblems)
    lines.push_back("changed problem: " + before + " -> " + problem.fSeverity + ": " + problem.fReason);
  for (TChange const& row : differences.fRows) lines.push_back("changed: " + TextOf(row));
  for (TObjectDifference const& object : differences.fObjects) lines.push_back(TextOf(object));
  if (lines.empty()) lines.emplace_back("no differences");
  for (std::string const& reason : NotCompared(differences)) lines.push_back("not compared: " + reason);
  std::string text;
  for (std::string const& line : lines) text += Printable(line) + "\n";
  return text;
}

std::string CountsOf(TDifferences const& differences) {
  std::vector<std::string> counts;
  auto const add = [&](std::size_t count, std::string const& what) {
    if (count > 0) counts.push_back(std::to_string(count) + " " + what);
  };
  for (EKind const kind : {EKind::kGone, EKind::kAppeared, EKind::kChanged}) {
    auto const count = std::count_if(differences.fObjects.begin(), differences.fObjects.end(),
                                     [&](TObjectDifference const& object) { return object.fKind == kind; });
    add(static_cast<std::size_t>(count) + (kind == EKind::kChanged ? differences.fRows.size() : 0), NameOf(kind));
  }
  auto const addProblems = [&](std::size_t count, std::string const& what) {
    add(count, what + (count == 1 ? " problem" : " problems"));
  };
  addProblems(differences.fNewProblems.size(), "new");
  addProblems(differences.fSolvedProblems.size(), "solved");
  addProblems(differences.fChangedProblems.size(), "changed");
  return Joined(counts, ", ");
}

TJson DifferencesAsJson(std::string const& document, EExitStatus status, TDifferences const& differences,
                        TStoredReport const& before, TStoredReport const& after) {
  std::string const counts = CountsOf(differences);
  std::string const reason = counts.empty() ? Joined(differences.fNotCompared, "; ") : "the reports differ: " + counts;
  TJson json = DocumentHead(document, status, reason, after.fLabel);
  json["before"] = SideAsJson(before);
  json["after"] = SideAsJson(after);
  TJson& objects = json["objects"] = TJson::array();
  for (TObjectDifference const& object : differences.fObjects)
    objects.push_back({{"kind", NameOf(object.fKind)},
                       {"class", object.fClass},
                       {"path", object.fPath},
                       {"name", object.fName},
                       {"changes", AsJson(object.fChanges)}});
  json["rows"] = AsJson(differences.fRows);
  json["newProblems"] = AsJson(differences.fNewProblems);
  json["solvedProblems"] = AsJson(differences.fSolvedProblems);
  json["changedProblems"] = AsJson(differences.fChangedProblems);
  json["notCompared"] = NotCompared(differences);
  return json;
}

}  // namespace NQRVZEP20::zep
