// SPDX-License-Identifier: Apache-2.0
#include "collect/findings/TRule.h"

#include <algorithm>
#include <utility>

namespace NQRVZEP20 {

namespace {

// Whether the provider could look for instances, and there are none.
bool MeansNone(TMissing const& why) {
  return why.fCode == kMissingNotGiven || why.fCode == kMissingNotApplicable || why.fCode == kMissingNotDescribed;
}

// Whether there may be instances that the provider could not read. Without a source, most machines have none.
bool MayHide(TMissing const& why) { return !MeansNone(why) && why.fCode != kMissingNoSource; }

bool IsOfSample(std::vector<TNamespaceView> const& views) {
  return std::any_of(views.begin(), views.end(), [](TNamespaceView const& view) { return !view.GetSampleLabel().empty(); });
}

}  // namespace

std::vector<TElement> TRuleRun::TryElements(std::string const& className) const {
  std::vector<TElement> elements;
  for (TNamespaceView const& view : fViews)
    for (auto const& instance : view.InstancesOf(className))
      if (view.IsOfReport(*instance)) elements.emplace_back(view, instance);
  return elements;
}

std::vector<TElement> TRuleRun::Elements(std::string const& className) {
  std::vector<TElement> elements = TryElements(className);
  if (IsOfSample(fViews)) {
    if (elements.empty()) NoteNotAsked({"the sample does not describe them", ""});
    return elements;
  }
  TMissing why{kMissingNotDescribed, "no provider describes " + className};
  bool isAnswered = !elements.empty();
  for (TNamespaceView const& view : fViews) {
    if (!view.FindClass(className) || !view.InstancesOf(className).empty()) continue;
    why = view.WhyNoInstance(className);
    isAnswered = isAnswered || MeansNone(why) || MayHide(why);
    if (MayHide(why)) NoteNotAsked({why.fReason, ""});
  }
  if (!isAnswered) NoteNotAsked({why.fReason, ""});
  return elements;
}

void TRuleRun::Add(TElement const& element, std::string const& source, ESeverity severity, std::string reason,
                   std::string remedy) {
  Add({"", severity, std::move(reason), std::move(remedy), element.Path(), source});
}

}  // namespace NQRVZEP20
