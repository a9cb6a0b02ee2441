// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "collect/findings/Findings.h"
#include "tools/zep/output/Json.h"

namespace NQRVZEP20::zep {

// The problems and the answers of all rules, for the member "findings" of a document.
TJson FindingsAsJson(TFindings const& findings);

}  // namespace NQRVZEP20::zep
