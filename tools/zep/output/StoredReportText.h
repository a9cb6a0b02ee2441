// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "collect/stored/StoredReport.h"

#include <string>

namespace NQRVZEP20::zep {

// A stored report for people, like ReportAsText: the head, the problems, the identity, the details and the tables.
std::string StoredReportAsText(TStoredReport const& report);

}  // namespace NQRVZEP20::zep
