// SPDX-License-Identifier: Apache-2.0
#include "collect/stored/Differences.h"

#include "collect/stored/ObjectName.h"
#include "collect/stored/TExamined.h"

#include <algorithm>
#include <cmath>
#include <cstdlib>
#include <iterator>
#include <string_view>

namespace NQRVZEP20 {

namespace {

using EKind = TObjectDifference::EKind;

// ---- What always changes ----

bool Contains(std::string_view text, std::string_view part) { return text.find(part) != text.npos; }

// Properties that change on a machine with which nothing has happened; those in the first column of any class.
struct TVolatile {
  std::string_view fClass, fProperty;
};
constexpr TVolatile kVolatile[] = {{"", "AvailableMemory"},
                                   {"", "AvailableSpace"},
                                   {"", "ClockTime"},
                                   {"", "CurrentClockSpeed"},
                                   {"", "FreeInodes"},
                                   {"", "FreeMemory"},
                                   {"", "FreePhysicalMemory"},
                                   {"", "FreeSpace"},
                                   {"", "FreeSpaceInPagingFiles"},
                                   {"", "FreeSwap"},
                                   {"", "FreeVirtualMemory"},
                                   {"", "LoadOfFifteenMinutes"},
                                   {"", "LoadOfFiveMinutes"},
                                   {"", "LoadOfOneMinute"},
                                   {"", "LoadPercentage"},
                                   {"", "LocalDateTime"},
                                   {"", "NumberOfFiles"},
                                   {"", "NumberOfProcesses"},
                                   {"", "NumberOfUsers"},
                                   {"", "PowerOnHours"},
                                   {"", "PreferredLifetime"},
                                   {"", "TotalPowerOnHours"},
                                   {"", "Uptime"},
                                   {"", "ValidLifetime"},
                                   {"ZEP_DiskHealth", "BytesRead"},
                                   {"ZEP_DiskHealth", "BytesWritten"},
                                   {"ZEP_KernelLog", "CurrentNumberOfRecords"},
                                   {"ZEP_KernelLog", "GoneRecords"},
                                   {"ZEP_RaidArray", "Progress"},
                                   {"ZEP_SmartAttribute", "RawText"},
                                   {"ZEP_SmartAttribute", "RawValue"},
                                   {"ZEP_SwapArea", "Used"}};

bool IsVolatile(std::string const& cls, std::string const& property) {
  bool const isTraffic = Contains(cls, "Statistics") && !Contains(property, "Error") && !Contains(property, "Failure");
  return isTraffic || std::any_of(std::begin(kVolatile), std::end(kVolatile), [&](TVolatile const& row) {
           return row.fProperty == property && (row.fClass.empty() || row.fClass == cls);
         });
}

bool IsReading(std::string const& cls, std::string const& property) {
  return property == "CurrentReading" || (cls == "ZEP_DiskHealth" && property == "Temperature") ||
         (cls == "ZEP_SmartAttribute" && property == "Value");
}

double NumberIn(TStoredProperty const* property) {
  return property != nullptr && property->IsKnown() ? std::strtod(property->fRaw.c_str(), nullptr) : 0;
}

// Whether the reading of a sensor moved less than makes it another one, in either direction.
bool IsWithinHysteresis(TStoredInstance const& before, TStoredInstance const& after, std::string const& name) {
  constexpr double usual = 0.1;  // of the reading
  TStoredProperty const *const one = before.Find(name), *const other = after.Find(name);
  if (!IsReading(before.fClass, name) || !one->IsKnown() || !other->IsKnown()) return false;
  double const hysteresis = std::max(NumberIn(before.Find("Hysteresis")), NumberIn(after.Find("Hysteresis")));
  double const largest = std::max(std::abs(NumberIn(one)), std::abs(NumberIn(other)));
  return std::abs(NumberIn(one) - NumberIn(other)) <= (hysteresis > 0 ? hysteresis : usual * largest);
}

// ---- Values ----

// For people: the rounded texts of different values may be equal; then the values themselves.
TChange ChangeOf(TStoredProperty const& before, TStoredProperty const& after) {
  auto const text = [&](TStoredProperty const& property) {
    if (!property.IsKnown()) return "unknown (" + property.fMissing.fReason + ")";
    return before.fText == after.fText ? property.fRaw : property.fText;
  };
  return {before.fName, text(before), text(after)};
}

bool IsSame(TStoredProperty const& before, TStoredProperty const& after) {
  return before.IsKnown() == after.IsKnown() && before.fRaw == after.fRaw;
}

// A property that only one of the programs knew is not a change of the machine.
std::vector<TChange> ChangesOf(TStoredInstance const& before, TStoredInstance const& after) {
  std::vector<TChange> changes;
  for (TStoredProperty const& property : before.fProperties) {
    TStoredProperty const* const other = after.Find(property.fName);
    if (other == nullptr || IsSame(property, *other) || IsVolatile(before.fClass, property.fName)) continue;
    if (!IsWithinHysteresis(before, after, property.fName)) changes.push_back(ChangeOf(property, *other));
  }
  return changes;
}

// ---- Objects ----

bool IsCompared(TStoredInstance const& instance) { return !instance.IsAssociation(); }

void AddOnce(std::string const& reason, std::vector<std::string>& reasons) {
  if (std::find(reasons.begin(), reasons.end(), reason) == reasons.end()) reasons.push_back(reason);
}

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

void AddChanged(TExamined const& before, TExamined const& after, TDifferences& differences) {
  for (auto const& [key, instance] : before.Instances()) {
    auto const other = after.Instances().find(key);
    if (other == after.Instances().end() || !IsCompared(*instance)) continue;
    if (auto changes = ChangesOf(*instance, *other->second); !changes.empty())
      differences.fObjects.push_back(DifferenceOf(EKind::kChanged, *other->second, std::move(changes)));
  }
}

// ---- Rows and problems ----

// A reason may contain a figure that changes, so two missing values are the same.
bool IsSame(TAnswer<std::string> const& before, TAnswer<std::string> const& after) {
  return before.IsKnown() == after.IsKnown() && (!before.IsKnown() || *before.fValue == *after.fValue);
}

void AddRows(std::vector<TStoredRow> const& before, std::vector<TStoredRow> const& after, std::vector<TChange>& changes) {
  auto const text = [](TStoredRow const& row) {
    return row.fAnswer.IsKnown() ? *row.fAnswer.fValue : "unknown (" + row.fAnswer.fMissing.fReason + ")";
  };
  for (TStoredRow const& row : before)
    for (TStoredRow const& other : after)
      if (row.fKey == other.fKey && !IsSame(row.fAnswer, other.fAnswer)) changes.push_back({row.fLabel, text(row), text(other)});
}

// The reason may contain a figure that changes, so it does not count.
bool AreOfOneCause(TStoredProblem const& one, TStoredProblem const& other) {
  return one.fRule == other.fRule && one.fInstance == other.fInstance;
}

bool IsSame(TStoredProblem const& one, TStoredProblem const& other) {
  return AreOfOneCause(one, other) && one.fSeverity == other.fSeverity;
}

// The problems of `some` that are not among `others`.
std::vector<TStoredProblem> Without(std::vector<TStoredProblem> const& others, std::vector<TStoredProblem> const& some) {
  std::vector<TStoredProblem> rest;
  std::copy_if(some.begin(), some.end(), std::back_inserter(rest), [&](TStoredProblem const& problem) {
    return std::none_of(others.begin(), others.end(), [&](TStoredProblem const& other) { return IsSame(problem, other); });
  });
  return rest;
}

// Removes those that have only another severity from both, and returns them.
std::vector<TChangedProblem> TakeChanged(std::vector<TStoredProblem>& before, std::vector<TStoredProblem>& after) {
  std::vector<TChangedProblem> changed;
  auto const isTaken = [&](TStoredProblem const& problem) {
    auto const other =
        std::find_if(before.begin(), before.end(), [&](TStoredProblem const& its) { return AreOfOneCause(its, problem); });
    if (other == before.end()) return false;
    changed.push_back({other->fSeverity, problem});
    before.erase(other);
    return true;
  };
  std::vector<TStoredProblem> rest;
  for (TStoredProblem& problem : after)
    if (!isTaken(problem)) rest.push_back(std::move(problem));
  after = std::move(rest);
  return changed;
}

// The problems that were found in `its` and could have been found in `other`. Adds why the rest could not.
std::vector<TStoredProblem> Comparable(std::vector<TStoredProblem> const& problems, TExamined const& its, TExamined const& other,
                                       std::vector<std::string>& notCompared) {
  std::vector<TStoredProblem> comparable;
  for (TStoredProblem const& problem : problems) {
    std::string const why = other.WhyUnknown(problem, its.Find(problem.fInstance));
    if (why.empty())
      comparable.push_back(problem);
    else
      AddOnce("problem \"" + problem.fReason + "\": " + why, notCompared);
  }
  return comparable;
}

}  // namespace

bool TDifferences::IsSame() const {
  return fObjects.empty() && fRows.empty() && fNewProblems.empty() && fSolvedProblems.empty() && fChangedProblems.empty();
}

std::string NameOf(TObjectDifference::EKind kind) {
  return kind == EKind::kGone ? "gone" : kind == EKind::kAppeared ? "appeared" : "changed";
}

TDifferences DifferencesOf(TStoredReport const& before, TStoredReport const& after) {
  TDifferences differences;
  auto& notCompared = differences.fNotCompared;
  TExamined const earlier(before), later(after);
  for (TExamined const* const examined : {&earlier, &later})
    for (auto const& [provider, failure] : examined->Failures()) AddOnce(failure, notCompared);
  AddMissing(EKind::kGone, earlier, later, differences);
  AddMissing(EKind::kAppeared, later, earlier, differences);
  AddChanged(earlier, later, differences);
  AddRows(before.fIdentity, after.fIdentity, differences.fRows);
  AddRows(before.fDetails, after.fDetails, differences.fRows);
  auto solved = Without(after.fProblems, before.fProblems), appeared = Without(before.fProblems, after.fProblems);
  differences.fChangedProblems = TakeChanged(solved, appeared);
  differences.fNewProblems = Comparable(appeared, later, earlier, notCompared);
  differences.fSolvedProblems = Comparable(solved, earlier, later, notCompared);
  return differences;
}

}  // namespace NQRVZEP20
