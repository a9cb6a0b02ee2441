// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "collect/findings/ESeverity.h"
#include "collect/findings/TElement.h"
#include "collect/findings/TThresholds.h"

#include <cstddef>
#include <functional>
#include <string>
#include <vector>

namespace NQRVZEP20 {

// A problem of this machine.
struct TProblem {
  std::string fRule;  // the identifier of the rule that found it; set by MakeFindings if empty
  ESeverity fSeverity;
  std::string fReason;    // what is wrong, as a sentence without a full stop: "the disk sda is failing"
  std::string fRemedy;    // what to do: "Save its data and replace it."
  std::string fInstance;  // the path of the instance (TNamespaceView::PathOf); empty if there is none
  std::string fSource;    // of the value that shows the problem; empty if unknown
};

// Why a rule could not examine an element, or any.
struct TNotAsked {
  std::string fReason;
  std::string fInstance;  // empty if there is no instance to examine
};

// The facts that a rule may use, and its answer. A rule calls Elements or TryElements for the instances of a class, Know for each
// value that it needs, and Add for each problem.
//
// Refers to the views and thresholds, which must outlive it. Exceptions of providers pass through.
class TRuleRun {
public:
  TRuleRun(std::vector<TNamespaceView> const& views, TThresholds const& thresholds) : fViews(views), fThresholds(thresholds) {}

  TThresholds const& Thresholds() const { return fThresholds; }

  // The instances of the class and its subclasses, from all providers; with a sample, only those of the sample. Notes
  // why a provider could not read its own, also if another has some; and if there are none, why no provider looked for them.
  std::vector<TElement> Elements(std::string const& className);

  // The same, but notes nothing.
  std::vector<TElement> TryElements(std::string const& className) const;

  // Whether the answer has a value; then the element counts as examined. Otherwise notes the reason, unless the value does not
  // apply to this element.
  template <class T>
  bool Know(TElement const& element, TAnswer<T> const& answer) {
    if (answer.IsKnown())
      ++fExamined;
    else if (!answer.IsNotApplicable())
      NoteNotAsked({answer.fMissing.fReason, element.Path()});
    return answer.IsKnown();
  }

  void Add(TElement const& element, std::string const& source, ESeverity severity, std::string reason, std::string remedy);
  void Add(TProblem problem) { fProblems.push_back(std::move(problem)); }
  void NoteNotAsked(TNotAsked notAsked) { fNotAsked.push_back(std::move(notAsked)); }

  std::size_t GetExamined() const { return fExamined; }
  std::vector<TProblem> const& GetProblems() const { return fProblems; }
  std::vector<TNotAsked> const& GetNotAsked() const { return fNotAsked; }

private:
  std::vector<TNamespaceView> const& fViews;
  TThresholds const& fThresholds;
  std::size_t fExamined = 0;
  std::vector<TProblem> fProblems;
  std::vector<TNotAsked> fNotAsked;
};

// A rule: a function over the namespaces that finds one kind of problem.
struct TRule {
  std::string fId;     // a fixed identifier: "disk-failing"
  std::string fTitle;  // the question that it answers: "Is a disk failing?"
  std::function<void(TRuleRun&)> fAsk;
};

}  // namespace NQRVZEP20
