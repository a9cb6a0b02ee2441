// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "collect/stored/StoredReport.h"

#include <string>

namespace NQRVZEP20::zep {

// The report as a page (HtmlPage in Html.h): the findings, the identity, the tables, the plug-ins, and every object with its
// properties except those that only relate others and the records of missing values. Rows are in the natural order of their
// first cell: "DIMM 2" precedes "DIMM 10".
std::string ReportAsHtml(TStoredReport const& report);

// "2026-11-23 04:05:06 UTC" for "2026-11-23T04:05:06Z"; "at an unknown time" for an empty text.
std::string TimeText(std::string const& time);

}  // namespace NQRVZEP20::zep
