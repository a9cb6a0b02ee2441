// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "collect/Report.h"

#include <string>

namespace NQRVZEP20::zep {

// The name of a file with the report: "zep-report-db1-20261121T041530Z" and the extension. The host name is that of the report,
// or "unknown", in characters that every file system accepts; the time is the current one, in UTC.
std::string ReportFileName(TReport const& report, char const* extension);

}  // namespace NQRVZEP20::zep
