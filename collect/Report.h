// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "collect/PlugIns.h"
#include "collect/TNamespaceView.h"
#include "tools/zep/output/ExitStatus.h"
#include "tools/zep/output/Json.h"

#include <string>
#include <vector>

namespace NQRVZEP20::zep {

struct TReportRow {
  std::string fKey;    // for programs: "serialNumber"
  std::string fLabel;  // for people: "Serial number"
  TAnswer fAnswer;
};

// Which machine this is, as the providers tell it.
struct TReport {
  std::vector<std::string> fHead;  // two lines: the machine, its operating system
  std::vector<TReportRow> fIdentity;
  std::vector<TReportRow> fDetails;
  std::vector<TPlugIn> fPlugIns;

  // Complete: every row of the identity is known, or does not apply to this machine, and no plug-in failed. Nothing: no row of
  // the identity is known. The details do not count.
  EExitStatus fStatus;
};

TReport MakeReport(std::vector<TPlugIn> plugIns);

// What is missing, and which plug-ins failed; empty when the report is complete.
std::string WhyNotComplete(TReport const& report);

std::string ReportAsText(TReport const& report);  // ReportText.cpp

// A document, with every instance of every namespace besides; its exit status is the report's (ReportJson.cpp).
TJson ReportAsJson(TReport const& report);

// What a file with the report is called: "zep-report-db1-20261121T041530Z" and the extension. The host name is the report's own,
// "unknown" when it has none, in characters that every file system takes; the time is now, in UTC (ReportFileName.cpp).
std::string ReportFileName(TReport const& report, char const* extension);

}  // namespace NQRVZEP20::zep
