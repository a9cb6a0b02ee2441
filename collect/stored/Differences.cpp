// SPDX-License-Identifier: Apache-2.0
#include "collect/stored/Differences.h"

#include "MissingValueClass.h"
#include "collect/stored/ObjectName.h"

#include <algorithm>
#include <cmath>
#include <cstdlib>
#include <map>
#include <set>
#include <string_view>

namespace NQRVZEP20 {

namespace {

using EKind = TObjectDifference::EKind;
using TInstances = std::map<std::string, TStoredInstance const*>;

// ---- What always changes ----

bool Contains(std::string_view text, std::string_view part) { return text.find(part) != text.npos; }

// Properties of any class that change on a machine with which nothing has happened.
bool IsVolatile(std::string const& cls, std::string const& property) {
  static std::set<std::string_view> const names = {"AvailableMemory",
                                                   "AvailableSpace",
                                                   "FreeInodes",
                                                   "FreeMemory",
                                                   "FreePhysicalMemory",
                                                   "FreeSpace",
                                                   "FreeSwap",
                                                   "FreeVirtualMemory",
                                                   "LoadOfFifteenMinutes",
                                                   "LoadOfFiveMinutes",
                                                   "LoadOfOneMinute",
                                                   "LoadPercentage",
                                                   "LocalDateTime",
                                                   "NumberOfFiles",
                                                   "NumberOfProcesses",
                                                   "NumberOfUsers",
                                                   "PowerOnHours",
                                                   "TotalPowerOnHours",
                                                   "Uptime",
                                                   "ClockTime",
                                                   "CurrentClockSpeed",
                                                   "SizeStoredInPagingFiles",
                                                   "FreeSpaceInPagingFiles"};
  bool const isTraffic = Contains(cls, "Statistics") && !Contains(property, "Error") && !Contains(property, "Failure");
  return names.count(property) > 0 || isTraffic;
}

// Whether the reading of a sensor moved less than makes it another one.
bool IsWithinHysteresis(TStoredInstance const& instance, TStoredProperty const& before, TStoredProperty const& after) {
  constexpr double usual = 0.1;  // of the reading
  if (before.fName != "CurrentReading" || !before.IsKnown() || !after.IsKnown()) return false;
  double const one = std::strtod(before.fRaw.c_str(), nullptr), other = std::strtod(after.fRaw.c_str(), nullptr);
  TStoredProperty const* const hysteresis = instance.Find("Hysteresis");
  bool const hasIts = hysteresis != nullptr && hysteresis->IsKnown();
  return std::abs(one - other) <= (hasIts ? std::strtod(hysteresis->fRaw.c_str(), nullptr) : usual * std::abs(one));
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
    if (!IsWithinHysteresis(before, property, *other)) changes.push_back(ChangeOf(property, *other));
  }
  return changes;
}

// ---- Objects ----

// The providers that failed, with the reason.
std::map<std::string, std::string> FailuresIn(TStoredReport const& report) {
  std::map<std::string, std::string> failures;
  for (TStoredProvider const& provider : report.fProviders)
    if (!provider.fError.empty()) failures[provider.fName.empty() ? provider.fPlugIn : provider.fName] = provider.fError;
  return failures;
}

std::set<std::string> ProvidersIn(TStoredReport const& report) {
  std::set<std::string> names;
  for (TStoredInstance const& instance : report.fInstances) names.insert(instance.fProvider);
  return names;
}

// The providers whose objects `other` cannot have, because they failed there or do not exist, and why.
std::map<std::string, std::string> Incomparable(TStoredReport const& report, TStoredReport const& other) {
  std::map<std::string, std::string> reasons;
  for (auto const& [name, failure] : FailuresIn(other))
    reasons[name] = "provider " + name + " failed in " + other.fFile + ": " + failure;
  for (std::string const& name : ProvidersIn(report)) {
    bool const exists = std::any_of(other.fProviders.begin(), other.fProviders.end(),
                                    [&](TStoredProvider const& provider) { return provider.fName == name; });
    if (!exists) reasons.emplace(name, "provider " + name + " does not exist in " + other.fFile);
  }
  return reasons;
}

TInstances ComparedIn(TStoredReport const& report, std::map<std::string, std::string> const& incomparable) {
  TInstances instances;
  for (TStoredInstance const& instance : report.fInstances)
    if (instance.fClass != kMissingValueClass && !instance.IsAssociation() && incomparable.count(instance.fProvider) == 0)
      instances.emplace(instance.fPath, &instance);
  return instances;
}

TObjectDifference DifferenceOf(EKind kind, TStoredInstance const& instance, std::vector<TChange> changes = {}) {
  return {kind, instance.fClass, instance.fPath, ObjectName(instance), std::move(changes)};
}

// The objects of `some` that `others` lacks.
void AddMissing(EKind kind, TInstances const& some, TInstances const& others, std::vector<TObjectDifference>& differences) {
  for (auto const& [path, instance] : some)
    if (others.count(path) == 0) differences.push_back(DifferenceOf(kind, *instance));
}

std::vector<TObjectDifference> ObjectsOf(TInstances const& before, TInstances const& after) {
  std::vector<TObjectDifference> differences;
  AddMissing(EKind::kGone, before, after, differences);
  AddMissing(EKind::kAppeared, after, before, differences);
  for (auto const& [path, instance] : before) {
    auto const other = after.find(path);
    auto changes = other == after.end() ? std::vector<TChange>() : ChangesOf(*instance, *other->second);
    if (!changes.empty()) differences.push_back(DifferenceOf(EKind::kChanged, *other->second, std::move(changes)));
  }
  return differences;
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

// The problems of `some` that `others` lacks. The reason may contain a figure that changes, so it does not count.
std::vector<TStoredProblem> ProblemsWithout(std::vector<TStoredProblem> const& some, std::vector<TStoredProblem> const& others) {
  std::vector<TStoredProblem> problems;
  for (TStoredProblem const& problem : some) {
    bool const isThere = std::any_of(others.begin(), others.end(), [&](TStoredProblem const& other) {
      return other.fRule == problem.fRule && other.fInstance == problem.fInstance && other.fSeverity == problem.fSeverity;
    });
    if (!isThere) problems.push_back(problem);
  }
  return problems;
}

}  // namespace

bool TDifferences::IsSame() const { return fObjects.empty() && fRows.empty() && fNewProblems.empty() && fSolvedProblems.empty(); }

std::string NameOf(TObjectDifference::EKind kind) {
  return kind == EKind::kGone ? "gone" : kind == EKind::kAppeared ? "appeared" : "changed";
}

TDifferences DifferencesOf(TStoredReport const& before, TStoredReport const& after) {
  TDifferences differences;
  auto incomparable = Incomparable(before, after);
  incomparable.merge(Incomparable(after, before));
  for (auto const& [provider, reason] : incomparable) differences.fNotCompared.push_back(reason);
  differences.fObjects = ObjectsOf(ComparedIn(before, incomparable), ComparedIn(after, incomparable));
  AddRows(before.fIdentity, after.fIdentity, differences.fRows);
  AddRows(before.fDetails, after.fDetails, differences.fRows);
  differences.fNewProblems = ProblemsWithout(after.fProblems, before.fProblems);
  differences.fSolvedProblems = ProblemsWithout(before.fProblems, after.fProblems);
  return differences;
}

}  // namespace NQRVZEP20
