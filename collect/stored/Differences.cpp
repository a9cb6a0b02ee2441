// SPDX-License-Identifier: Apache-2.0
#include "collect/stored/Differences.h"

#include "collect/stored/ObjectName.h"
#include "collect/stored/TExamined.h"
#include "collect/stored/UsualChanges.h"

#include <algorithm>
#include <iterator>
#include <map>
#include <set>
#include <utility>

namespace NQRVZEP20 {

namespace {

using EKind = TObjectDifference::EKind;

// ---- What could not be compared ----

void AddOnce(std::string const& reason, std::vector<std::string>& reasons) {
  if (std::find(reasons.begin(), reasons.end(), reason) == reasons.end()) reasons.push_back(reason);
}

// The values that one report could not read, by its file and the reason.
class TUnreadValues {
public:
  void Add(std::string const& file, std::string const& reason, std::string const& value) {
    fValues[{file, reason}].insert(value);
  }

  void AddTo(std::vector<std::string>& notCompared) const {
    for (auto const& [row, values] : fValues) {
      std::string names;
      for (std::string const& value : values) names += (names.empty() ? "" : ", ") + value;
      AddOnce(row.first + " has no " + names + ": " + row.second, notCompared);
    }
  }

private:
  std::map<std::pair<std::string, std::string>, std::set<std::string>> fValues;
};

// ---- Values ----

// A known text; quotes show where an empty one is.
std::string Shown(std::string const& text) { return text.empty() ? "\"\"" : text; }

std::string Unknown(TMissing const& missing) { return "unknown (" + missing.fReason + ")"; }

// For people: the rounded texts of different values may be equal; then the values themselves.
TChange ChangeOf(TStoredProperty const& before, TStoredProperty const& after) {
  auto const text = [&](TStoredProperty const& property) {
    if (!property.IsKnown()) return Unknown(property.fMissing);
    return Shown(before.fText == after.fText ? property.fRaw : property.fText);
  };
  return {before.fName, text(before), text(after)};
}

bool IsSame(TStoredProperty const& before, TStoredProperty const& after) {
  return before.IsKnown() == after.IsKnown() && before.fRaw == after.fRaw;
}

// Two reports, and what their comparison finds.
struct TComparison {
  TExamined const &fBefore, &fAfter;
  TUnreadValues fUnread;
  TDifferences fDifferences;

  // Whether one of the reports could not read the value, which is noted then. The other one has it.
  bool IsUnread(TMissing const& before, TMissing const& after, std::string const& value) {
    bool const isBefore = NQRVZEP20::IsUnread(before.fCode);
    if (!isBefore && !NQRVZEP20::IsUnread(after.fCode)) return false;
    fUnread.Add((isBefore ? fBefore : fAfter).File(), (isBefore ? before : after).fReason, value);
    return true;
  }
};

// A property that only one of the programs knew is not a change of the machine.
std::vector<TChange> ChangesOf(TStoredInstance const& before, TStoredInstance const& after, TComparison& comparison) {
  std::vector<TChange> changes;
  for (TStoredProperty const& property : before.fProperties) {
    TStoredProperty const* const other = after.Find(property.fName);
    if (other == nullptr || IsSame(property, *other) || IsUsualChange(before, after, property.fName)) continue;
    if (!comparison.IsUnread(property.fMissing, other->fMissing, before.fClass + "." + property.fName))
      changes.push_back(ChangeOf(property, *other));
  }
  return changes;
}

// ---- Objects ----

bool IsCompared(TStoredInstance const& instance) { return !instance.IsAssociation(); }

TObjectDifference DifferenceOf(EKind kind, TStoredInstance const& instance, std::vector<TChange> changes = {}) {
  return {kind, instance.fClass, instance.fPath, ObjectName(instance), std::move(changes)};
}

// Adds the objects of `some` that `others` lacks, or why it may lack them.
void AddMissing(EKind kind, TExamined const& some, TExamined const& others, TDifferences& differences) {
  for (auto const& [key, instance] : some.Instances()) {
    if (!IsCompared(*instance) || others.Instances().count(key) > 0) continue;
    std::string const why = others.WhyUnknown(*instance);
    if (why.empty())
      differences.fObjects.push_back(DifferenceOf(kind, *instance));
    else
      AddOnce(why, differences.fNotCompared);
  }
}

void AddChanged(TComparison& comparison) {
  for (auto const& [key, instance] : comparison.fBefore.Instances()) {
    auto const other = comparison.fAfter.Instances().find(key);
    if (other == comparison.fAfter.Instances().end() || !IsCompared(*instance)) continue;
    if (auto changes = ChangesOf(*instance, *other->second, comparison); !changes.empty())
      comparison.fDifferences.fObjects.push_back(DifferenceOf(EKind::kChanged, *other->second, std::move(changes)));
  }
}

// ---- Rows ----

// A reason may contain a figure that changes, so two missing values are the same.
bool IsSame(TAnswer<std::string> const& before, TAnswer<std::string> const& after) {
  return before.IsKnown() == after.IsKnown() && (!before.IsKnown() || *before.fValue == *after.fValue);
}

// Values of two sources differ although nothing has changed: the kernel uses less memory than the modules have.
bool AreOfOneSource(TAnswer<std::string> const& before, TAnswer<std::string> const& after) {
  return !before.IsKnown() || !after.IsKnown() || before.fSource == after.fSource;
}

void AddRow(TStoredRow const& before, TStoredRow const& after, TComparison& comparison) {
  auto const text = [](TStoredRow const& row) {
    return row.fAnswer.IsKnown() ? Shown(*row.fAnswer.fValue) : Unknown(row.fAnswer.fMissing);
  };
  if (IsSame(before.fAnswer, after.fAnswer)) return;
  if (comparison.IsUnread(before.fAnswer.fMissing, after.fAnswer.fMissing, before.fLabel)) return;
  TDifferences& differences = comparison.fDifferences;
  if (AreOfOneSource(before.fAnswer, after.fAnswer))
    differences.fRows.push_back({before.fLabel, text(before), text(after)});
  else
    AddOnce(before.fLabel + " is from " + before.fAnswer.fSource + " in " + comparison.fBefore.File() + ", and from " +
                after.fAnswer.fSource + " in " + comparison.fAfter.File(),
            differences.fNotCompared);
}

void AddRows(std::vector<TStoredRow> const& before, std::vector<TStoredRow> const& after, TComparison& comparison) {
  for (TStoredRow const& row : before)
    for (TStoredRow const& other : after)
      if (row.fKey == other.fKey) AddRow(row, other, comparison);
}

// ---- Problems ----

// The reason of a problem may contain a figure that changes, so it does not count.
struct TCause {
  std::string fRule, fObject;
  TStoredProblem fProblem;

  bool operator==(TCause const& other) const { return fRule == other.fRule && fObject == other.fObject; }
};
using TCauses = std::vector<TCause>;

TCauses CausesOf(std::vector<TStoredProblem> const& problems, TExamined const& examined) {
  TCauses causes;
  for (TStoredProblem const& problem : problems)
    causes.push_back({problem.fRule, examined.LastingPathOf(problem.fInstance), problem});
  return causes;
}

// Those of `some` that are not among `others` with the same severity.
TCauses Without(TCauses const& others, TCauses const& some) {
  TCauses rest;
  std::copy_if(some.begin(), some.end(), std::back_inserter(rest), [&](TCause const& cause) {
    return std::none_of(others.begin(), others.end(), [&](TCause const& other) {
      return cause == other && cause.fProblem.fSeverity == other.fProblem.fSeverity;
    });
  });
  return rest;
}

// Removes those that have only another severity from both, and returns them.
std::vector<TChangedProblem> TakeChanged(TCauses& before, TCauses& after) {
  std::vector<TChangedProblem> changed;
  TCauses rest;
  for (TCause& cause : after) {
    auto const other = std::find(before.begin(), before.end(), cause);
    if (other == before.end()) {
      rest.push_back(std::move(cause));
      continue;
    }
    changed.push_back({other->fProblem.fSeverity, cause.fProblem});
    before.erase(other);
  }
  after = std::move(rest);
  return changed;
}

// The problems that were found in `its` and could have been found in `other`. Adds why the rest could not.
std::vector<TStoredProblem> Comparable(TCauses const& causes, TExamined const& its, TExamined const& other,
                                       std::vector<std::string>& notCompared) {
  std::vector<TStoredProblem> comparable;
  for (TCause const& cause : causes) {
    TStoredProblem const& problem = cause.fProblem;
    std::string const why = other.WhyUnknown(problem, its.Find(problem.fInstance));
    if (why.empty())
      comparable.push_back(problem);
    else
      AddOnce("problem \"" + problem.fReason + "\": " + why, notCompared);
  }
  return comparable;
}

void AddProblems(TStoredReport const& before, TStoredReport const& after, TComparison& comparison) {
  TExamined const &earlier = comparison.fBefore, &later = comparison.fAfter;
  TDifferences& differences = comparison.fDifferences;
  TCauses const causesBefore = CausesOf(before.fProblems, earlier), causesAfter = CausesOf(after.fProblems, later);
  TCauses solved = Without(causesAfter, causesBefore), appeared = Without(causesBefore, causesAfter);
  differences.fChangedProblems = TakeChanged(solved, appeared);
  differences.fNewProblems = Comparable(appeared, later, earlier, differences.fNotCompared);
  differences.fSolvedProblems = Comparable(solved, earlier, later, differences.fNotCompared);
}

}  // namespace

bool TDifferences::IsSame() const {
  return fObjects.empty() && fRows.empty() && fNewProblems.empty() && fSolvedProblems.empty() && fChangedProblems.empty();
}

std::string NameOf(TObjectDifference::EKind kind) {
  return kind == EKind::kGone ? "gone" : kind == EKind::kAppeared ? "appeared" : "changed";
}

TDifferences DifferencesOf(TStoredReport const& before, TStoredReport const& after) {
  TExamined const earlier(before), later(after);
  TComparison comparison{earlier, later, {}, {}};
  TDifferences& differences = comparison.fDifferences;
  for (TExamined const* const examined : {&earlier, &later})
    for (auto const& [provider, failure] : examined->Failures()) AddOnce(failure, differences.fNotCompared);
  AddMissing(EKind::kGone, earlier, later, differences);
  AddMissing(EKind::kAppeared, later, earlier, differences);
  AddChanged(comparison);
  AddRows(before.fIdentity, after.fIdentity, comparison);
  AddRows(before.fDetails, after.fDetails, comparison);
  comparison.fUnread.AddTo(differences.fNotCompared);
  AddProblems(before, after, comparison);
  return std::move(differences);
}

}  // namespace NQRVZEP20
