#include "TLogger.h"

#include "TCommUtil.h"
#include "TOSSpecific.h"
#include "TZEPException.h"

#include <boost/thread/lock_guard.hpp>
#include <boost/thread/tss.hpp>

#include <array>
#include <atomic>
#include <cerrno>
#include <cstdlib>
#include <memory>
#include <string_view>

namespace NQRVZEP20 {
namespace {

std::string const gFileSeparator = "/";  // the logger's own operations do not use it
std::string const gDefaultLogFileDir = "/var/log/QRV_Support/ZepDebugLog/";

}  // namespace

ILogger::EZEPLogSeverity TLogger::fThreshold = kLogStatus;
std::string TLogger::m_logFileDir = gDefaultLogFileDir;
boost::recursive_mutex TLogger::fLogEntriesMutex;
std::list<ILogger::TLogEntry> TLogger::fLogEntries;

namespace {

// Whether the list and its lock exist. Destructors that run after theirs at the end of the process may still log (those of
// the registered providers do run then); what they log is not recorded.
std::atomic<bool> gListExists = false;
struct TListLife {
  TListLife() { gListExists = true; }
  ~TListLife() { gListExists = false; }
} const gListLife;

// The calling thread's logger, null before its first call and after the thread let it go: GetInstance then costs one load.
thread_local TLogger* tInstance = nullptr;

void DeleteInstance(TLogger* instance) {
  tInstance = nullptr;
  std::unique_ptr<TLogger> const end(instance);
}

// Owns every thread's logger, and ends it with its thread. At the end of the process the owner is destroyed itself, together
// with the logger of the thread that ends the process.
std::atomic<bool> gOwnerExists = true;
struct TOwner {
  ~TOwner() { gOwnerExists = false; }
  boost::thread_specific_ptr<TLogger> fSlot{DeleteInstance};
};

// A thread that logs once its logger is gone (from the destructor of a thread-local or static object) gets a new one, which
// lives to the end of the process where nothing is left to own it.
TLogger* MakeInstance() {
  static TOwner owner;
  auto instance = std::make_unique<TLogger>();
  if (gOwnerExists) owner.fSlot.reset(instance.get());
  return instance.release();
}

constexpr std::array<std::string_view, 5> kLabels = {"[Error] ", "[Warning] ", "[Status] ", "[Debug] ", "[Verbose] "};

bool HasLabel(ILogger::EZEPLogSeverity severity) { return static_cast<unsigned int>(severity) < kLabels.size(); }

bool IsMemoryOnly(ILogger::EZEPLogSeverity severity) {
  return severity == ILogger::kLogMemoryOnly || severity == ILogger::kLogMemoryOnlyAlways;
}

// "3/3/2024  9:5:7 ", without zero fill. Each field is of a reading of its own: a line that is written across the turn of a
// second may mix two times. Kept.
std::string LocalTimeText() {
  auto const second = std::to_string(TOSSpecific::GetLocalTime().GetSecond());
  auto const minute = std::to_string(TOSSpecific::GetLocalTime().GetMinute());
  auto const hour = std::to_string(TOSSpecific::GetLocalTime().GetHour());
  auto const year = std::to_string(TOSSpecific::GetLocalTime().GetYear());
  auto const day = std::to_string(TOSSpecific::GetLocalTime().GetDay());
  auto const month = std::to_string(TOSSpecific::GetLocalTime().GetMonth());
  return month + "/" + day + "/" + year + "  " + hour + ":" + minute + ":" + second + " ";
}

std::string LineOf(ILogger::EZEPLogSeverity severity, std::string const& message) {
  std::string line = "FDR_";
  line.append(kLabels[severity]).append(LocalTimeText()).append(message).append("\n");
  return line;
}

void Record(ILogger::EZEPLogSeverity severity, std::string const& message) {
  ILogger::TLogEntry entry{severity, message, TOSSpecific::GetLocalTime()};
  TLogger::PushBackLog(entry);
}

void WriteFlushed(std::FILE* file, char const* text) {
  std::fputs(text, file);
  std::fflush(file);
}

}  // namespace

ILogger::~ILogger() = default;

TLogger* TLogger::GetInstance() {
  if (tInstance == nullptr) tInstance = MakeInstance();
  return tInstance;
}

TLogger::TLogger() : fLogFile(nullptr), fInitialized(false) {}

TLogger::~TLogger() {
  if (fLogFile == nullptr) return;
  WriteFlushed(fLogFile, "-- ZEP Log Closed ----------------------------\n");
  std::fclose(fLogFile);
  fLogFile = nullptr;
}

void TLogger::SetLogThreshold(EZEPLogSeverity threshold) { fThreshold = threshold; }

ILogger::EZEPLogSeverity TLogger::GetLogThreshold() { return fThreshold; }

void TLogger::SetLogFileDir(std::string directory) { m_logFileDir = directory; }

std::string TLogger::GetLogFileDir() { return m_logFileDir; }

void TLogger::PushBackLog(TLogEntry& entry) {
  if (!gListExists) return;
  boost::lock_guard<boost::recursive_mutex> const lock(fLogEntriesMutex);
  fLogEntries.push_back(entry);
}

std::list<ILogger::TLogEntry>& TLogger::GetLog() { return fLogEntries; }

void TLogger::ClearLog() {
  if (!gListExists) return;
  boost::lock_guard<boost::recursive_mutex> const lock(fLogEntriesMutex);
  fLogEntries.clear();
}

TZEPStatusCode TLogger::Initialize(std::string name) {
  if (fInitialized) return kZEPStatusOK;
  TCommUtil::MkDirHier(m_logFileDir);
  SetLogFilename(m_logFileDir + name + ".log");  // a derived logger's, where it overrides this
  fInitialized = true;
  return kZEPStatusOK;
}

void TLogger::SetLogFilename(std::string path) {
  fLogFilename = path;
  // The stream of an earlier call is not closed: it stays open, unused. Kept.
  fLogFile = std::fopen(path.c_str(), std::getenv("QRV_YBNQI_GUI_T") ? "a+" : "w+");
  if (fLogFile == nullptr) throw TZEPException(errno == EACCES ? kZEPStatusAccessDenied : kZEPStatusFileSystemError);
  WriteFlushed(fLogFile, "-- ZEP Log Opened ----------------------------\n");
}

void TLogger::OutputLogEntry(EZEPLogSeverity severity, std::string const& message) {
  if (severity > fThreshold && !IsMemoryOnly(severity)) return;

  if (severity <= kLogStatus || IsMemoryOnly(severity)) Record(severity, message);
  if (IsMemoryOnly(severity) || fLogFile == nullptr) return;
  if (!HasLabel(severity)) throw TZEPException(kZEPStatusFail);

  std::string const line = LineOf(severity, message);
  if (fLogFilename.empty())
    TOSSpecific::OutputLogString(line);
  else
    WriteFlushed(fLogFile, line.c_str());
}

void TLogger::SysLogEntry(EZEPLogSeverity severity, std::string const& message) {
  if (!HasLabel(severity)) throw TZEPException(kZEPStatusFail);
  TOSSpecific::LogSELEvent(LineOf(severity, message).c_str(), severity, 1);
}

}  // namespace NQRVZEP20
