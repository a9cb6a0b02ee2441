// SPDX-License-Identifier: Apache-2.0
#include "TLogger.h"

#include "TCommUtil.h"
#include "TOSSpecific.h"
#include "TZEPException.h"
#include "core/Handles.h"
#include "os/LocalTime.h"

#include <fcntl.h>
#include <pthread.h>
#include <sys/stat.h>
#include <boost/thread/exceptions.hpp>
#include <boost/thread/lock_guard.hpp>

#include <array>
#include <atomic>
#include <cerrno>
#include <charconv>
#include <cstdlib>
#include <iterator>
#include <memory>
#include <string_view>

namespace NQRVZEP20 {
namespace {

std::string const gDefaultLogFileDir = "/var/log/QRV_Support/ZepDebugLog/";

}  // namespace

ILogger::EZEPLogSeverity TLogger::fThreshold = kLogStatus;
std::string TLogger::m_logFileDir = gDefaultLogFileDir;
boost::recursive_mutex TLogger::fLogEntriesMutex;
std::list<ILogger::TLogEntry> TLogger::fLogEntries;

namespace {

// Whether the list and its lock exist. At the end of the process, destructors that run after theirs may still log (those of the
// registered providers do); their entries are not recorded.
std::atomic<bool> gListExists = false;
struct TListLife {
  TListLife() { gListExists = true; }
  ~TListLife() { gListExists = false; }
} const gListLife;

// The calling thread's logger; null before the first call and after its end. GetInstance costs one load, and no call to find the
// address of the variable.
[[gnu::tls_model("initial-exec")]] thread_local TLogger* tInstance = nullptr;

void DeleteInstance(void* instance) {
  tInstance = nullptr;
  std::unique_ptr<TLogger> const end(static_cast<TLogger*>(instance));
}

void CheckOrThrow(int error) {
  if (error != 0) throw boost::thread_resource_error(error, "TLogger::GetInstance");
}

// Destroys each thread's logger when the thread ends, after the thread's own objects, and the last thread's at the end of the
// process, when this object is destroyed. boost::thread_specific_ptr does the same, but needs a library that doubles the time to
// load this one.
std::atomic<bool> gOwnerExists = true;
class TOwner {
public:
  TOwner() { CheckOrThrow(::pthread_key_create(&fKey, DeleteInstance)); }
  ~TOwner() {
    gOwnerExists = false;
    ::pthread_key_delete(fKey);
    DeleteInstance(tInstance);
  }
  TOwner(TOwner const&) = delete;
  TOwner& operator=(TOwner const&) = delete;

  void Own(TLogger* instance) { CheckOrThrow(::pthread_setspecific(fKey, instance)); }

private:
  pthread_key_t fKey;
};

// A thread that logs after its logger was destroyed (from an object that ends later) gets a new one. At the end of the process
// nothing owns the new one any more, so it is never destroyed.
TLogger* MakeInstance() {
  static TOwner owner;
  auto instance = std::make_unique<TLogger>();
  if (gOwnerExists) owner.Own(instance.get());
  return instance.release();
}

constexpr std::array<std::string_view, 5> kLabels = {"[Error] ", "[Warning] ", "[Status] ", "[Debug] ", "[Verbose] "};

bool HasLabel(ILogger::EZEPLogSeverity severity) { return static_cast<unsigned int>(severity) < kLabels.size(); }

bool IsMemoryOnly(ILogger::EZEPLogSeverity severity) {
  return severity == ILogger::kLogMemoryOnly || severity == ILogger::kLogMemoryOnlyAlways;
}

// A short text of pieces and numbers, built without an allocation.
class TShortText {
public:
  TShortText& operator<<(std::string_view piece) {
    fSize += piece.copy(fText + fSize, piece.size());
    return *this;
  }
  TShortText& operator<<(int number) {
    fSize = static_cast<std::size_t>(std::to_chars(fText + fSize, std::end(fText), number).ptr - fText);
    return *this;
  }
  std::string_view View() const { return {fText, fSize}; }

private:
  char fText[128];  // the widest numbers leave it half empty
  std::size_t fSize = 0;
};

// "FDR_[Status] 3/3/2024  9:5:7 ", without zero fill. Each field is read from the clock separately: a line that is written while
// the second changes may mix two times. Kept.
TShortText HeadOf(ILogger::EZEPLogSeverity severity) {
  TLocalClock clock;  // the same as in GetLocalTime
  int const second = clock.Now().fFields.tm_sec;
  int const minute = clock.Now().fFields.tm_min;
  int const hour = clock.Now().fFields.tm_hour;
  int const year = clock.Now().fFields.tm_year + 1900;
  int const day = clock.Now().fFields.tm_mday;
  int const month = clock.Now().fFields.tm_mon + 1;
  TShortText head;
  head << "FDR_" << kLabels[severity] << month << "/" << day << "/" << year << "  " << hour << ":" << minute << ":" << second;
  return head << " ";
}

std::string LineOf(ILogger::EZEPLogSeverity severity, std::string const& message) {
  TShortText const head = HeadOf(severity);
  std::string line;
  line.reserve(head.View().size() + message.size() + 1);
  return line.append(head.View()).append(message).append("\n");
}

constexpr mode_t kOwnerOnly = S_IRUSR | S_IWUSR;

// A file created here is readable by its owner only, whatever the umask: entries at debug severity may contain passwords.
TUniqueFd OpenLogFile(std::string const& path, int flags) {
  TUniqueFd made(::open(path.c_str(), flags | O_CREAT | O_EXCL, kOwnerOnly));
  if (!made && errno == EEXIST) return TUniqueFd(::open(path.c_str(), flags | O_CREAT, kOwnerOnly));
  if (made) ::fchmod(made.get(), kOwnerOnly);  // a file system without modes refuses this; the log is still written
  return made;
}

// Like std::fopen, with that mode for a new file. Returns null, with the reason in errno, on failure.
std::FILE* OpenLogStream(std::string const& path, bool isAppended) {
  TUniqueFd file = OpenLogFile(path, O_RDWR | (isAppended ? O_APPEND : O_TRUNC));
  std::FILE* const stream = file ? ::fdopen(file.get(), isAppended ? "a+" : "w+") : nullptr;
  if (stream != nullptr) file.release();
  return stream;
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

TLogger::TLogger() = default;

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

// The entry is made in its place, before the lock is taken: copying it into the list would take as long as making it.
void TLogger::Record(EZEPLogSeverity severity, std::string const& message) {
  std::list<TLogEntry> entry(1);
  entry.front().fSeverity = severity;
  entry.front().fMessage = message;
  SetToLocalTime(entry.front().fTimeStamp);
  if (!gListExists) return;
  boost::lock_guard<boost::recursive_mutex> const lock(fLogEntriesMutex);
  fLogEntries.splice(fLogEntries.end(), entry);
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
  SetLogFilename(m_logFileDir + name + ".log");  // virtual: a derived logger may override it
  fInitialized = true;
  return kZEPStatusOK;
}

void TLogger::SetLogFilename(std::string path) {
  fLogFilename = path;
  // The stream of an earlier call stays open, unused. Kept.
  fLogFile = OpenLogStream(path, std::getenv("QRV_YBNQI_GUI_T") != nullptr);
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
