#include "core/Log.h"

#include "TRootObject.h"

namespace NQRVZEP20 {

bool IsLogged(ILogger::EZEPLogSeverity severity) {
  ILogger* const logger = TRootObject::GetCoreLogger();
  return logger != nullptr && severity <= logger->GetLogThreshold();
}

void WriteLogEntry(ILogger::EZEPLogSeverity severity, std::string const& message) {
  if (ILogger* const logger = TRootObject::GetCoreLogger()) logger->OutputLogEntry(severity, message);
}

}  // namespace NQRVZEP20
