// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "ILogger.h"
#include "TZEPStatusCode.h"

#include <boost/thread/recursive_mutex.hpp>

#include <cstdio>

namespace NQRVZEP20 {

// The logger. Each thread has its own logger and log file; all threads share the threshold, the log directory and the
// in-memory list of important entries.
//
// A thread's logger has no file until the thread calls Initialize or SetLogFilename. When the thread ends, the logger is
// destroyed and its file is closed. Every line is flushed immediately. A lock guards the list while an entry is added or the
// list is cleared. No lock guards the threshold and the directory; set them during start-up. Operations that write a file
// block until the system has accepted the data.
class ZEP_EXPORT TLogger : public ILogger {
public:
  // The calling thread's logger, created on the thread's first call. Never null; owned by the thread. A call after the
  // thread's logger was destroyed, for example from the destructor of a static object, creates a new one, which has no file.
  // Throws boost::thread_resource_error when the system has no resources for another logger.
  static TLogger* GetInstance();

  // ---- Shared by all threads ----

  // Entries with a severity above the threshold are dropped. Initially kLogStatus. Any value is accepted.
  static void SetLogThreshold(EZEPLogSeverity threshold);

  // The directory in which Initialize creates log files, with its trailing slash. Initially
  // "/var/log/QRV_Support/ZepDebugLog/". Any string is accepted.
  static void SetLogFileDir(std::string directory);
  static std::string GetLogFileDir();

  // Appends a copy of the entry to the list. May be called on any thread.
  static void PushBackLog(TLogEntry& entry);

  // ---- This thread's log file ----

  TLogger();
  TLogger(TLogger const&) = delete;
  TLogger& operator=(TLogger const&) = delete;

  // Writes the closing banner and closes the file, if one is open.
  ~TLogger() override;

  // Creates the log directory with its parents and opens "<directory><name>.log" through SetLogFilename. A new directory gets
  // the permission bits 0777 minus the umask: with a umask of 022 other users can list the names of the log files, and with a
  // umask of 0 they can also rename and replace them. After the first success, further calls on the same logger do nothing.
  // Always returns kZEPStatusOK. Exceptions of TCommUtil::MkDirHier and SetLogFilename pass through; Initialize can then be
  // called again.
  TZEPStatusCode Initialize(std::string name);

  // Opens the file and writes the opening banner. A new file gets the permission bits 0600, regardless of the umask,
  // because entries at debug severity may contain passwords and the contents of files. An existing file keeps its bits and
  // its owner; it is truncated, or appended to when the environment variable QRV_YBNQI_GUI_T is set to any value. Throws
  // kZEPStatusAccessDenied for EACCES and kZEPStatusFileSystemError for any other failure. After a failure nothing is
  // written until a later call succeeds. A stream opened by an earlier call stays open, unused. Kept.
  void SetLogFilename(std::string path) override;

  // ---- Writing ----

  // First drops an entry whose severity is above the threshold, unless the severity is kLogMemoryOnly or kLogMemoryOnlyAlways.
  // Then adds the entry to the list if its severity is at most kLogStatus, which includes negative ones, or if it is
  // memory-only. Then writes the entry, unless it is memory-only, to this thread's file, if there is one, in this form:
  //   FDR_[Status] 3/3/2024  9:5:7 message
  // A zero byte in the message ends the written line there, without a newline; the list holds the complete message. Kept.
  // Throws kZEPStatusFail when a file is open and the severity is neither memory-only nor kLogError to kLogVerbose. Write
  // errors are not reported.
  void OutputLogEntry(EZEPLogSeverity severity, std::string const& message) override;

  // Writes the same line to the system log, regardless of the threshold; adds nothing to the list. Throws kZEPStatusFail
  // when the severity is not kLogError to kLogVerbose.
  void SysLogEntry(EZEPLogSeverity severity, std::string const& message) override;

  // ---- The list ----

  std::list<TLogEntry>& GetLog() override;  // the shared list, unlocked: do not read it while other threads log
  void ClearLog() override;
  EZEPLogSeverity GetLogThreshold() override;

private:
  static void Record(EZEPLogSeverity severity, std::string const& message);

  std::string fLogFilename;  // set before the file is opened, and also when opening fails
  std::FILE* fLogFile = nullptr;
  bool fInitialized = false;

  static EZEPLogSeverity fThreshold;
  static std::list<TLogEntry> fLogEntries;
  static boost::recursive_mutex fLogEntriesMutex;
  static std::string m_logFileDir;
};

}  // namespace NQRVZEP20
