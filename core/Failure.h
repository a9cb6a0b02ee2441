// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "ILogger.h"
#include "TZEPStatusCode.h"

#include <string>
#include <string_view>

namespace NQRVZEP20 {

// Logs one line, which consists of `before`, `reason` and `after`, and throws TZEPFailure with the code and the reason. Without
// a logger, or for a severity above the threshold, it only throws.
//
//   LogErrorAndThrow(kZEPStatusFileNotFound, "ERROR: CaptureFile ", "failed to open: " + path);
[[noreturn]] void LogAndThrow(ILogger::EZEPLogSeverity severity, EZEPStatusCode code, std::string_view before,
                              std::string const& reason, std::string_view after = "");

[[noreturn]] void LogErrorAndThrow(EZEPStatusCode code, std::string_view before, std::string const& reason,
                                   std::string_view after = "");

}  // namespace NQRVZEP20
