// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "collect/stored/StoredReport.h"
#include "tools/zep/output/ReportText.h"

#include <string>

namespace NQRVZEP20::zep {

// A stored report for people, like ReportAsText: the head, the problems, the identity, the details and the tables. The rules and
// the plug-ins are printed if the parts name "findings" and "plug-ins".
std::string StoredReportAsText(TStoredReport const& report, TReportParts const& parts = {});

}  // namespace NQRVZEP20::zep
