// SPDX-License-Identifier: Apache-2.0
#include "collect/findings/ControllerElements.h"

namespace NQRVZEP20 {

std::vector<TElement> OfController(TRuleRun& run, char const* className) {
  if (run.Elements("ZEP_ManagementController").empty()) return {};
  return run.Elements(className);
}

}  // namespace NQRVZEP20
