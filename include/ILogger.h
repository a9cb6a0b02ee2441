// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "TCIMDateTime.h"
#include "ZEPExport.h"

#include <list>
#include <string>

namespace NQRVZEP20 {

// The interface through which the library writes all diagnostic text. TRootObject::GetCoreLogger() returns the calling
// thread's logger; TLogger documents each operation.
class ZEP_EXPORT ILogger {
public:
  enum EZEPLogSeverity : int {
    kLogError = 0,
    kLogWarning = 1,
    kLogStatus = 2,
    kLogDebug = 3,
    kLogVerbose = 4,
    kLogMemoryOnly = 100,       // recorded in the in-memory list regardless of the threshold; never written to a file
    kLogMemoryOnlyAlways = 101  // the same, recorded with this severity
  };

  // One recorded entry.
  struct TLogEntry {
    EZEPLogSeverity fSeverity;
    std::string fMessage;     // as passed: no label, no time, no newline
    TCIMDateTime fTimeStamp;  // the local time at which it was recorded
  };

  virtual ~ILogger();
  virtual void OutputLogEntry(EZEPLogSeverity severity, std::string const& message) = 0;
  virtual void SysLogEntry(EZEPLogSeverity severity, std::string const& message) = 0;
  virtual std::list<TLogEntry>& GetLog() = 0;
  virtual void ClearLog() = 0;
  virtual EZEPLogSeverity GetLogThreshold() = 0;
  virtual void SetLogFilename(std::string path) = 0;
};

}  // namespace NQRVZEP20
