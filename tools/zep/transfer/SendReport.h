// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "collect/Report.h"
#include "tools/zep/transfer/Transfer.h"

namespace NQRVZEP20::zep {

// The result of sending a report.
struct TSentReport {
  TTransferred fTransferred;
  std::string fKeptIn;  // the file that holds the report after a failure; empty after a success, or if it could not be written
};

// Compresses the report's JSON document into a file (ReportFileName with ".json.gz"), sends it, and prints the result to standard
// error. If sending fails for any reason, the file is kept.
TSentReport SendReport(TReport const& report, TTarget const& target, TTransferOptions const& options);

// Why the exit status is not 0, for the document of the report.
std::string ReasonOf(TTransferred const& transferred);

}  // namespace NQRVZEP20::zep
