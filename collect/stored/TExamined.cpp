// SPDX-License-Identifier: Apache-2.0
#include "collect/stored/TExamined.h"

#include "Missing.h"
#include "MissingValueClass.h"
#include "collect/stored/UsualChanges.h"

#include <algorithm>
#include <set>

namespace NQRVZEP20 {

namespace {

std::string TextOf(TStoredInstance const& instance, char const* property) {
  TStoredProperty const* const found = instance.Find(property);
  return found == nullptr ? "" : found->fText;
}

}  // namespace

bool IsUnread(std::string const& code) {
  return !code.empty() && code != kMissingNotGiven && code != kMissingNotApplicable && code != kMissingPlaceholder;
}

TExamined::TExamined(TStoredReport const& report) : fReport(report) {
  for (TStoredProvider const& provider : report.fProviders) {
    std::string const& name = provider.fName.empty() ? provider.fPlugIn : provider.fName;
    if (!provider.fError.empty()) fFailures[name] = "provider " + name + " failed in " + report.fFile + ": " + provider.fError;
  }
  AddInstances();
  AddReasons();
}

void TExamined::AddInstances() {
  std::map<std::string, int> counts;
  for (TStoredInstance const& instance : fReport.fInstances) {
    if (instance.fClass == kMissingValueClass) continue;
    std::string const path = LastingPath(instance);
    if (path != instance.fPath) fLastingPaths.emplace(instance.fPath, path);
    fInstances.emplace(TKey(path, counts[path]++), &instance);
  }
}

// A class that has objects is described, even if the provider gives a reason for some that are missing.
void TExamined::AddReasons() {
  std::set<TClass> described;
  for (auto const& [key, instance] : fInstances) described.emplace(instance->fNamespace, instance->fClass);
  std::map<std::string, std::set<TClass>> unread;  // by reason
  for (TStoredInstance const& instance : fReport.fInstances) {
    bool const isOfClass = instance.fClass == kMissingValueClass && TextOf(instance, "ElementProperty").empty();
    TClass const cls(instance.fNamespace, isOfClass ? TextOf(instance, "ElementPath") : "");
    if (isOfClass && IsUnread(TextOf(instance, "Code")) && described.count(cls) == 0)
      unread[TextOf(instance, "Reason")].insert(cls);
  }
  for (auto const& [reason, classes] : unread) {
    std::string names;
    for (TClass const& cls : classes) names += (names.empty() ? "" : ", ") + cls.second;
    for (TClass const& cls : classes) fWhyNoObjects[cls] = fReport.fFile + " has no " + names + ": " + reason;
  }
}

std::string TExamined::LastingPathOf(std::string const& path) const {
  auto const lasting = fLastingPaths.find(path);
  return lasting == fLastingPaths.end() ? path : lasting->second;
}

TStoredInstance const* TExamined::Find(std::string const& path) const {
  auto const found = fInstances.find({LastingPathOf(path), 0});
  return found == fInstances.end() ? nullptr : found->second;
}

std::string TExamined::WhyUnknown(TStoredInstance const& instance) const {
  if (auto const failure = fFailures.find(instance.fProvider); failure != fFailures.end()) return failure->second;
  bool const exists = std::any_of(fReport.fProviders.begin(), fReport.fProviders.end(),
                                  [&](TStoredProvider const& provider) { return provider.fName == instance.fProvider; });
  if (!exists) return "provider " + instance.fProvider + " does not exist in " + fReport.fFile;
  auto const why = fWhyNoObjects.find({instance.fNamespace, instance.fClass});
  return why == fWhyNoObjects.end() ? "" : why->second;
}

std::string TExamined::WhyUnknown(TStoredProblem const& problem, TStoredInstance const* instance) const {
  std::string const rule = "the rule " + problem.fRule;
  auto const asked = std::find_if(fReport.fRules.begin(), fReport.fRules.end(),
                                  [&](TStoredRule const& its) { return its.fId == problem.fRule; });
  if (asked == fReport.fRules.end()) return rule + " does not exist in " + fReport.fFile;
  bool const hasObject = Find(problem.fInstance) != nullptr;
  for (TStoredNotExamined const& left : asked->fNotExamined)
    if (left.fInstance == problem.fInstance || (left.fInstance.empty() && !hasObject) || asked->fOutcome == "not-asked")
      return rule + " could not examine it in " + fReport.fFile + ": " + left.fReason;
  if (asked->fOutcome == "not-asked") return rule + " could not be asked in " + fReport.fFile;
  return instance == nullptr || hasObject ? "" : WhyUnknown(*instance);
}

}  // namespace NQRVZEP20
