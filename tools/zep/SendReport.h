#pragma once

#include "Report.h"
#include "Transfer.h"

namespace NQRVZEP20::zep {

// Packs the report's document (ReportFileName and ".gz") and sends it; says on standard error what became of it. When it
// cannot be sent the file is kept. Returns what zep is to end with: the report's own status when it was sent.
EExitStatus SendReport(TReport const& report, TTarget const& target, TTransferOptions const& options);

}  // namespace NQRVZEP20::zep
