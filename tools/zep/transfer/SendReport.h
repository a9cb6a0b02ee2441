// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "collect/Report.h"
#include "tools/zep/transfer/Transfer.h"

namespace NQRVZEP20::zep {

// A report that was sent, or was not.
struct TSentReport {
  TTransferred fTransferred;
  std::string fKeptIn;  // the file with the report; empty when it was sent, or could not even be written
};

// Packs the report's document (ReportFileName and ".gz") and sends it; says on standard error what became of it. When it
// cannot be sent, for whatever reason, the file is kept.
TSentReport SendReport(TReport const& report, TTarget const& target, TTransferOptions const& options);

// Why the exit status is not 0, for the document of the report.
std::string ReasonOf(TTransferred const& transferred);

}  // namespace NQRVZEP20::zep
