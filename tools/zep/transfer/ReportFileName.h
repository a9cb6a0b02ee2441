// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "tools/zep/output/Json.h"

#include <string>

namespace NQRVZEP20::zep {

// The file name for the document of a report: "zep-report-db1-20261121T041530Z" followed by the extension. The host name is the
// one in the document, or "unknown"; characters that some file systems refuse are replaced. The time is the current time in UTC.
std::string ReportFileName(TJson const& document, char const* extension);

}  // namespace NQRVZEP20::zep
