// SPDX-License-Identifier: Apache-2.0
#include "collect/findings/ControllerElements.h"

namespace NQRVZEP20 {

std::vector<TElement> OfController(TRuleRun& run, char const* className) {
  if (run.Elements("ZEP_ManagementController").empty()) return {};
  return run.Elements(className);
}

void NoteUnread(TRuleRun& run, std::string const& list) {
  for (TElement const& controller : run.TryElements("ZEP_ManagementController")) {
    auto const parts = controller.Texts("UnreadParts");
    if (!parts.IsKnown()) continue;
    for (std::string const& part : *parts.fValue)  // "sensors: the time limit …"
      if (part.rfind(list + ": ", 0) == 0) run.NoteNotAsked({"not read to the end: " + part, controller.Path()});
  }
}

}  // namespace NQRVZEP20
