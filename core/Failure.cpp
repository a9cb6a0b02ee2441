// SPDX-License-Identifier: Apache-2.0
#include "core/Failure.h"

#include "TZEPFailure.h"
#include "core/Log.h"

namespace NQRVZEP20 {

void LogAndThrow(ILogger::EZEPLogSeverity severity, EZEPStatusCode code, std::string_view before, std::string const& reason,
                 std::string_view after) {
  Log(severity, before, reason, after);
  throw TZEPFailure(code, reason);
}

void LogErrorAndThrow(EZEPStatusCode code, std::string_view before, std::string const& reason, std::string_view after) {
  LogAndThrow(ILogger::kLogError, code, before, reason, after);
}

}  // namespace NQRVZEP20
