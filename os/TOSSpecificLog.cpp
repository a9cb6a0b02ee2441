// SPDX-License-Identifier: Apache-2.0
#include "TOSSpecific.h"
#include "core/Log.h"

#include <syslog.h>

namespace NQRVZEP20 {
namespace {

int PriorityOf(ILogger::EZEPLogSeverity severity) {
  if (severity == ILogger::kLogError) return LOG_ERR;
  if (severity == ILogger::kLogWarning) return LOG_WARNING;
  return LOG_NOTICE;
}

}  // namespace

void TOSSpecific::OutputLogString(std::string) {}

void TOSSpecific::DebugOut(std::string text) { LogDebug("TOSSpecific debug output: ", text); }

void TOSSpecific::LogSELEvent(char const* text, ILogger::EZEPLogSeverity severity, int) {
  ::openlog("YBNQ", LOG_NDELAY, LOG_SYSLOG);
  ::syslog(PriorityOf(severity), "%s", text);
  ::closelog();
}

}  // namespace NQRVZEP20
