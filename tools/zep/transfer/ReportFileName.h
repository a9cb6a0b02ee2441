// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "collect/Report.h"

#include <string>

namespace NQRVZEP20::zep {

// The file name for a report: "zep-report-db1-20261121T041530Z" followed by the extension. The host name is the one in the
// report, or "unknown"; characters that some file systems refuse are replaced. The time is the current time in UTC.
std::string ReportFileName(TReport const& report, char const* extension);

}  // namespace NQRVZEP20::zep
