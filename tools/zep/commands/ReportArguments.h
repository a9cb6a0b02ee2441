// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "tools/zep/commands/Bundling.h"
#include "tools/zep/commands/Providers.h"
#include "tools/zep/commands/Redacting.h"
#include "tools/zep/output/ReportText.h"
#include "tools/zep/transfer/SendReport.h"

#include <string>

namespace CLI {
class App;
}

namespace NQRVZEP20::zep {

constexpr char const* kJsonLines = "jsonl";

// The arguments of zep report.
struct TReportArguments {
  bool fAsJson = false;
  std::string fFormat;  // "text", "json" or "jsonl"; empty: as fAsJson says
  bool fSample = false;
  bool fBySftp = false;
  std::string fTarget;  // empty: nowhere
  TTransferOptions fOptions;
  TPlugInArguments fPlugIns;
  TReportParts fParts;
  TRedactionArguments fRedaction;
  bool fIsConfirmed = false;  // a report is sent without a question
  std::string fFailOn;        // a severity; empty for none
  std::string fFrom;          // a stored report; empty for this machine
  std::string fSince;         // a stored report to compare with; empty for none
  std::string fReplay;        // a recording; empty for this machine
  std::string fHtmlFile;      // the page to write; empty for none
  TBundleArguments fBundle;
  std::string fMedium;  // the device to write to; empty for standard output
};

// Adds the options of zep report, which set `arguments`; those outlive the command.
void AddReportOptions(CLI::App& command, TReportArguments& arguments);

}  // namespace NQRVZEP20::zep
