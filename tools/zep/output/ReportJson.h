// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "collect/Report.h"
#include "tools/zep/output/Json.h"

namespace NQRVZEP20::zep {

// The report as a document, with every instance of every namespace. Its exit status reflects the completeness of the report.
TJson ReportAsJson(TReport const& report);

}  // namespace NQRVZEP20::zep
