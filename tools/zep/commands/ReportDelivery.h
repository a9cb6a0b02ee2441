// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "tools/zep/commands/ReportArguments.h"
#include "tools/zep/commands/TMadeReport.h"
#include "tools/zep/processes/Interrupts.h"

#include <optional>

namespace NQRVZEP20::zep {

// The name of the document about a report that was written to a medium.
constexpr char const* kToMedia = "zep report --to-media";

// Prints or stores the report, writes its bundle with `evidence` if one is wanted, sends it to `target` if that was requested,
// and returns the exit status. The JSON document is printed last, because it contains the exit status. From the mounting of the
// medium on, and while the report is sent, `guard` holds back interrupts. Throws if the report cannot be printed or stored.
int Deliver(TMadeReport const& made, TEvidence const& evidence, TTarget const& target, TReportArguments const& arguments,
            std::optional<TInterruptGuard>& guard);

}  // namespace NQRVZEP20::zep
