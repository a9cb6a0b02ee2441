// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "collect/stored/Differences.h"

#include <string>

namespace NQRVZEP20::zep {

// The differences of two reports as a page (HtmlPage in Html.h).
std::string DifferencesAsHtml(TDifferences const& differences, TStoredReport const& before, TStoredReport const& after);

}  // namespace NQRVZEP20::zep
