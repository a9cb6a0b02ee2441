// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "tools/zep/output/ReportJson.h"
#include "tools/zep/transfer/Transfer.h"

namespace NQRVZEP20::zep {

// The result of sending a report.
struct TSentReport {
  TTransferred fTransferred;
  std::string fKeptIn;  // the file that holds the report after a failure; empty after a success, or if it could not be written
};

// Compresses the document of a report into a file (ReportFileName with ".json.gz"), sends it, and prints the result to standard
// error. If sending fails for any reason, the file is kept.
TSentReport SendReport(TReportDocument const& document, TTarget const& target, TTransferOptions const& options);

// Why the exit status is not 0, for the document of the report.
std::string ReasonOf(TTransferred const& transferred);

}  // namespace NQRVZEP20::zep
