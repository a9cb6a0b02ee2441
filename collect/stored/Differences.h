// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "collect/stored/StoredReport.h"

#include <string>
#include <vector>

namespace NQRVZEP20 {

// A value that two reports give differently, as text with units or words; the reason where a value is missing.
struct TChange {
  std::string fName;  // of the property or the row
  std::string fBefore, fAfter;
};

// An object that only one of two reports has, or that has changed.
struct TObjectDifference {
  enum class EKind { kGone, kAppeared, kChanged };

  EKind fKind;
  std::string fClass, fPath;
  std::string fName;              // for people (ObjectName.h)
  std::vector<TChange> fChanges;  // only of a changed object
};

// A problem that both reports have, with another severity.
struct TChangedProblem {
  std::string fSeverityBefore;
  TStoredProblem fProblem;  // of the later report
};

struct TDifferences {
  std::vector<TObjectDifference> fObjects;  // those that are gone, then those that appeared, then those that changed
  std::vector<TChange> fRows;               // of the identity and the details
  std::vector<TStoredProblem> fNewProblems, fSolvedProblems;
  std::vector<TChangedProblem> fChangedProblems;
  std::vector<std::string> fNotCompared;  // why: "provider Storage failed in b.json: no disk"

  bool IsSame() const;
};

// For programs: "gone", "appeared" and "changed".
std::string NameOf(TObjectDifference::EKind kind);

// Compares two reports, object by object; objects are the same if they have the same lasting path, and so the same class and
// keys. Ignored are relations between objects, records of missing values, and what always changes (UsualChanges.h). An object, a
// value or a problem that only one report has is not compared if the other could not examine it (TExamined.h): nothing is gone,
// new, changed or solved that one of them merely did not see. Values of identity and details are not compared if they have other
// sources.
TDifferences DifferencesOf(TStoredReport const& before, TStoredReport const& after);

}  // namespace NQRVZEP20
