// SPDX-License-Identifier: Apache-2.0
#include "collect/stored/TExamined.h"

#include "Missing.h"
#include "MissingValueClass.h"

#include <algorithm>
#include <set>

namespace NQRVZEP20 {

namespace {

std::string TextOf(TStoredInstance const& instance, char const* property) {
  TStoredProperty const* const found = instance.Find(property);
  return found == nullptr ? "" : found->fText;
}

// Whether the source of the objects was missing or could not be read. Otherwise the machine has none of them.
bool IsUnread(std::string const& code) {
  return code != kMissingNotGiven && code != kMissingNotApplicable && code != kMissingPlaceholder;
}

}  // namespace

TExamined::TExamined(TStoredReport const& report) : fReport(report) {
  for (TStoredProvider const& provider : report.fProviders) {
    std::string const& name = provider.fName.empty() ? provider.fPlugIn : provider.fName;
    if (!provider.fError.empty()) fFailures[name] = "provider " + name + " failed in " + report.fFile + ": " + provider.fError;
  }
  std::map<std::string, int> counts;
  std::map<std::string, std::set<std::pair<std::string, std::string>>> unread;  // by reason
  for (TStoredInstance const& instance : report.fInstances) {
    if (instance.fClass != kMissingValueClass) {
      fInstances.emplace(TKey(instance.fPath, counts[instance.fPath]++), &instance);
    } else if (TextOf(instance, "ElementProperty").empty() && IsUnread(TextOf(instance, "Code"))) {
      unread[TextOf(instance, "Reason")].emplace(instance.fNamespace, TextOf(instance, "ElementPath"));
    }
  }
  for (auto const& [reason, classes] : unread) {
    std::string names;
    for (auto const& [ns, cls] : classes) names += (names.empty() ? "" : ", ") + cls;
    for (auto const& row : classes) fWhyNoObjects[row] = report.fFile + " has no " + names + ": " + reason;
  }
}

TStoredInstance const* TExamined::Find(std::string const& path) const {
  auto const found = fInstances.find({path, 0});
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
