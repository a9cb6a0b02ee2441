#pragma once

#include "ILogger.h"
#include "TZEPStatusCode.h"

#include <boost/thread/recursive_mutex.hpp>

#include <cstdio>

namespace NQRVZEP20 {

// The logger. Each thread has its own, with its own log file; the threshold, the log directory and the in-memory list of
// the important entries are shared by all.
//
// A thread's logger has no file until the thread calls Initialize or SetLogFilename; it is destroyed, and its file closed,
// when the thread ends. Every written line is flushed at once. The list is guarded by a lock; threshold and directory are
// not, and are meant to be set during start-up. Every operation blocks for the file system.
class ZEP_EXPORT TLogger : public ILogger {
public:
  // The calling thread's logger, made on its first call. Never null; owned by the thread. What still calls this after the
  // thread's logger was destroyed (from the destructor of a static object, say) gets a new one, which has no file. Throws
  // boost::thread_resource_error when the system has no place for it.
  static TLogger* GetInstance();

  // ---- Shared by all threads ----

  // Entries with a severity above the threshold are dropped. Initially kLogStatus. Any value is taken.
  static void SetLogThreshold(EZEPLogSeverity threshold);

  // Where Initialize puts log files: a directory with its trailing slash. Initially
  // "/var/log/QRV_Support/ZepDebugLog/". Any text is taken.
  static void SetLogFileDir(std::string directory);
  static std::string GetLogFileDir();

  // Appends a copy of the entry to the list. Any thread.
  static void PushBackLog(TLogEntry& entry);

  // ---- This thread's log file ----

  TLogger();
  TLogger(TLogger const&) = delete;
  TLogger& operator=(TLogger const&) = delete;

  // Writes the closing banner and closes the file, if one is open.
  ~TLogger() override;

  // Makes the log directory with its parents (permission bits 0777 less the umask: under the usual one others may list the
  // names of the log files, under a umask of 0 they may also rename and replace them) and opens "<directory><name>.log"
  // through SetLogFilename. Only the first successful call of an instance does anything; every return is kZEPStatusOK. What
  // TCommUtil::MkDirHier and SetLogFilename throw passes through, and Initialize can then be called again.
  TZEPStatusCode Initialize(std::string name);

  // Opens the file and writes the opening banner. A file that is made here has the permission bits 0600, whatever the
  // umask: entries at debug severity may hold passwords and the contents of files. An existing file keeps its bits and its
  // owner, and is truncated, unless the environment variable QRV_YBNQI_GUI_T is set (to anything), which appends. Throws
  // kZEPStatusAccessDenied for EACCES and kZEPStatusFileSystemError for any other failure; the name stays set then, and nothing
  // is written until a later call succeeds. A stream opened by an earlier call stays open, unused.
  void SetLogFilename(std::string path) override;

  // ---- Writing ----

  // Drops an entry above the threshold before anything else is done; kLogMemoryOnly and kLogMemoryOnlyAlways are never
  // dropped. Records severities up to kLogStatus (negative ones too) and the two memory-only ones in the list; writes the
  // others to this thread's file, if it has one:
  //   FDR_[Status] 3/3/2024  9:5:7 message
  // A zero byte in the message ends the written line there, without a newline; the list has the whole message.
  // Throws kZEPStatusFail when a file is open and the severity is none of kLogError to kLogVerbose. Failing writes go
  // unnoticed.
  void OutputLogEntry(EZEPLogSeverity severity, std::string const& message) override;

  // Hands the same line to the system log, whatever the threshold; nothing is recorded. Throws kZEPStatusFail when the
  // severity is none of kLogError to kLogVerbose.
  void SysLogEntry(EZEPLogSeverity severity, std::string const& message) override;

  // ---- The list ----

  std::list<TLogEntry>& GetLog() override;  // the list itself, unlocked: do not read it while other threads log
  void ClearLog() override;
  EZEPLogSeverity GetLogThreshold() override;

private:
  std::string fLogFilename;  // set before the open, so it stays set when the open fails
  std::FILE* fLogFile;
  bool fInitialized;

  static EZEPLogSeverity fThreshold;
  static std::list<TLogEntry> fLogEntries;
  static boost::recursive_mutex fLogEntriesMutex;
  static std::string m_logFileDir;
};

}  // namespace NQRVZEP20
