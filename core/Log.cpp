// SPDX-License-Identifier: Apache-2.0
#include "core/Log.h"

#include "TRootObject.h"

namespace NQRVZEP20 {

bool IsLogged(ILogger::EZEPLogSeverity severity) {
  ILogger* const logger = TRootObject::GetCoreLogger();
  if (logger == nullptr) return false;
  bool const isNeverFiltered = severity == ILogger::kLogMemoryOnly || severity == ILogger::kLogMemoryOnlyAlways;
  return isNeverFiltered || severity <= logger->GetLogThreshold();
}

void WriteLogEntry(ILogger::EZEPLogSeverity severity, std::string const& message) {
  if (ILogger* const logger = TRootObject::GetCoreLogger()) logger->OutputLogEntry(severity, message);
}

}  // namespace NQRVZEP20
