// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "collect/stored/StoredReport.h"

#include <map>
#include <string>
#include <utility>

namespace NQRVZEP20 {

// Whether the code of a missing value says that its source was missing or could not be read. The machine may have the value then;
// with the other codes it has none.
bool IsUnread(std::string const& code);

// What a report could examine. The machine may have an object or a problem that its report lacks: where a provider failed, where
// a source could not be read, and where a rule could not be asked.
//
// Refers to the report, which must outlive it.
class TExamined {
public:
  explicit TExamined(TStoredReport const& report);

  std::string const& File() const { return fReport.fFile; }

  // The objects of the report, by lasting path (UsualChanges.h) and, of several with one path, their number.
  using TKey = std::pair<std::string, int>;
  std::map<TKey, TStoredInstance const*> const& Instances() const { return fInstances; }
  TStoredInstance const* Find(std::string const& path) const;  // by its own path; the first; null if there is none
  std::string LastingPathOf(std::string const& path) const;    // of the object that has the path, or the path itself

  // Why the machine may have an object like this one, which the report lacks; empty if the report would contain it.
  std::string WhyUnknown(TStoredInstance const& instance) const;

  // The same for a problem of another report. `instance`: the object in the other report that has the problem, or null.
  std::string WhyUnknown(TStoredProblem const& problem, TStoredInstance const* instance) const;

  // The providers that failed, and why: "provider Storage failed in b.json: no disk".
  std::map<std::string, std::string> const& Failures() const { return fFailures; }

private:
  using TClass = std::pair<std::string, std::string>;  // with its namespace, which is first

  TStoredReport const& fReport;
  std::map<TKey, TStoredInstance const*> fInstances;
  std::map<std::string, std::string> fLastingPaths;  // by path, where they differ
  std::map<std::string, std::string> fFailures;      // by the name of the provider
  std::map<TClass, std::string> fWhyNoObjects;

  void AddInstances();
  void AddReasons();
};

}  // namespace NQRVZEP20
