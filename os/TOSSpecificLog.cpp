// SPDX-License-Identifier: Apache-2.0
#include "TOSSpecific.h"

#include "TLogger.h"
#include "core/Handles.h"
#include "core/Log.h"
#include "os/LocalTime.h"
#include "os/SystemLog.h"

#include <syslog.h>

#include <array>
#include <cstdio>

namespace NQRVZEP20 {
namespace {

int PriorityOf(ILogger::EZEPLogSeverity severity) {
  if (severity == ILogger::kLogError) return LOG_ERR;
  if (severity == ILogger::kLogWarning) return LOG_WARNING;
  return LOG_NOTICE;
}

// ---- The file of a debug session ----

constexpr std::size_t kPathSize = 256;  // with the zero byte

// The start (`path`, or the default of the collector's variant), the machine type and the local time. A longer path is cut off.
std::array<char, kPathSize> DebugFilePath(char const* path) {
  std::string const start = path != nullptr             ? path
                            : TOSSpecific::isOEMBuild() ? "/var/log/OEM_Support/zep_"
                                                        : "/var/log/QRV_Support/zep_";
  std::string const type = TOSSpecific::GetMachineType();
  std::tm const now = TLocalClock().Now().fFields;
  std::array<char, kPathSize> whole{};
  std::snprintf(whole.data(), whole.size(), "%s%s%04d%02d%02d-%02d%02d%02d.log", start.c_str(), type.c_str(), now.tm_year + 1900,
                now.tm_mon + 1, now.tm_mday, now.tm_hour, now.tm_min, now.tm_sec);
  return whole;
}

}  // namespace

void TOSSpecific::OutputLogString(std::string) {}

void TOSSpecific::DebugOut(std::string text) { LogDebug("TOSSpecific debug output: ", text); }

void TOSSpecific::LogSELEvent(char const* text, ILogger::EZEPLogSeverity severity, int) {
  WriteToSystemLog(PriorityOf(severity), text);
}

bool TOSSpecific::SetDebugLevel(int level, char* path) {
  // The empty file marks the start of a debug session. A failure to create it is not reported. Kept.
  TUniqueFile const file(std::fopen(DebugFilePath(path).data(), "w"));
  if (level < ILogger::kLogError || level > ILogger::kLogVerbose) return false;
  TLogger::SetLogThreshold(static_cast<ILogger::EZEPLogSeverity>(level));
  return true;
}

}  // namespace NQRVZEP20
