#include "Watched.h"

#include "ILogger.h"
#include "TChildProcess.h"
#include "TRootObject.h"
#include "TZEPException.h"
#include "Text.h"

#include <fcntl.h>
#include <poll.h>
#include <signal.h>
#include <sys/stat.h>
#include <unistd.h>

#include <algorithm>
#include <cctype>
#include <chrono>
#include <filesystem>
#include <fstream>
#include <system_error>

namespace NQRVZEP20::zep {

namespace {

namespace fs = std::filesystem;
using TClock = std::chrono::steady_clock;

constexpr int kLookEveryMilliseconds = 100;

EExitStatus ExitStatusOf(TZEPStatusCode const& status) {
  if (status == kZEPStatusOK) return kExitComplete;
  if (status == kZEPStatusConnectionFailed) return kExitNoConnection;
  if (status == kZEPStatusLibCurlFailure) return kExitNoLibrary;
  return kExitNothing;
}

// ---- In the child ----

// What the library logged last as an error, less the name of the operation.
std::string LoggedReason() {
  ILogger* const logger = TRootObject::GetCoreLogger();
  if (logger == nullptr || logger->GetLog().empty()) return "";
  std::string const& message = logger->GetLog().back().fMessage;
  std::size_t const name = message.find(": ");
  return message.rfind("TOSSpecific|", 0) == 0 && name != message.npos ? message.substr(name + 2) : message;
}

// The report of the child: the status as a number, a blank, and the reason.
std::string ReportOf(std::function<TZEPStatusCode()> const& transfer) {
  TZEPStatusCode status = kZEPStatusFail;
  std::string reason;
  try {
    status = transfer();
  } catch (TZEPException const& failure) {
    status = failure.GetStatusCode();
  } catch (std::exception const& failure) {
    reason = failure.what();
  }
  if (reason.empty() && status != kZEPStatusOK) reason = LoggedReason();
  return std::to_string(status.GetCode()) + " " + reason;
}

std::string ReportOfSilent(std::function<TZEPStatusCode()> const& transfer) {
  TDescriptor const nowhere(::open("/dev/null", O_RDWR));
  ::dup2(nowhere.Get(), STDIN_FILENO);
  ::dup2(nowhere.Get(), STDOUT_FILENO);
  if (ILogger* const logger = TRootObject::GetCoreLogger()) logger->ClearLog();
  return ReportOf(transfer);
}

// ---- In zep ----

struct stat StatusOf(std::string const& path) {
  struct stat status {};
  ::stat(path.c_str(), &status);  // of a file that is not there all is 0
  return status;
}

bool IsSameFile(struct stat const& a, struct stat const& b) { return a.st_dev == b.st_dev && a.st_ino == b.st_ino; }

// How far a process has read the file, whatever its name is by now.
std::uint64_t PositionIn(struct stat const& file, pid_t process) {
  std::error_code gone;
  std::uint64_t position = 0;
  std::string const directory = "/proc/" + std::to_string(process);
  for (auto entry = fs::directory_iterator(directory + "/fd", gone); !gone && entry != fs::directory_iterator();
       entry.increment(gone)) {
    if (!IsSameFile(StatusOf(entry->path()), file)) continue;
    std::ifstream info(directory + "/fdinfo/" + entry->path().filename().string());
    std::string word;
    std::uint64_t number = 0;
    if (info >> word >> number && word == "pos:") position = std::max(position, number);
  }
  return position;
}

// What moves during a transfer: the position in a file that is sent, which was `file` at the start; the size of one that is
// fetched.
std::uint64_t BytesMoved(TWatch const& watch, struct stat const& file, pid_t process) {
  std::error_code absent;
  if (watch.fIsUpload) return PositionIn(file, process);
  std::uintmax_t const size = fs::file_size(watch.fFile, absent);
  return absent ? 0 : size;
}

bool IsWordAt(std::string const& text, std::size_t at, std::size_t length) {
  auto const isLetter = [&](std::size_t i) { return i < text.size() && std::isalnum(static_cast<unsigned char>(text[i])) != 0; };
  return (at == 0 || !isLetter(at - 1)) && !isLetter(at + length);
}

// A short secret is hidden only where it stands alone: stars within other words would tell it.
std::string Without(std::string const& secret, std::string text) {
  constexpr std::size_t kShort = 4;
  if (secret.empty()) return text;
  for (std::size_t at = 0; (at = text.find(secret, at)) != text.npos;) {
    bool const isHidden = secret.size() >= kShort || IsWordAt(text, at, secret.size());
    if (isHidden) text.replace(at, secret.size(), "***");
    at += isHidden ? 3 : 1;
  }
  return text;
}

// Where libcurl itself is missing, and not a function of it, the package that has it is named.
std::string RemedyFor(std::string const& reason) {
  bool const isMissing = reason.find("Error opening curl library: ") != reason.npos;
  return isMissing ? "; install the package libcurl4" : "";
}

bool EndsWith(std::string const& text, std::string const& end) {
  return text.size() >= end.size() && text.compare(text.size() - end.size(), end.size(), end) == 0;
}

TOutcome OutcomeOf(std::string const& report, TWatch const& watch) {
  std::size_t const blank = report.find(' ');
  if (blank == report.npos) return {kZEPStatusFail, kExitNothing, "the process of the transfer died"};
  TZEPStatusCode const status(static_cast<EZEPStatusCode>(std::stoi(report.substr(0, blank))));
  if (status == kZEPStatusOK) return {status, kExitComplete, ""};
  std::string reason = Printable(Without(watch.fSecret, report.substr(blank + 1)));
  if (EndsWith(reason, ": ")) reason += "libcurl does not tell why";
  reason += RemedyFor(reason);
  return {status, ExitStatusOf(status), reason.empty() ? status.TranslateStatusCode() : reason};
}

TOutcome Stalled(TWatch const& watch) {
  return {kZEPStatusTransferFailure, kExitStalled, "nothing moved for " + std::to_string(watch.fStallSeconds) + " s"};
}

// Reads the report until the child is done; false when it stood still for too long.
bool ReadReport(TChildProcess& child, TWatch const& watch, std::string& report) {
  struct stat const file = StatusOf(watch.fFile);
  std::uint64_t last = BytesMoved(watch, file, child.Id());
  TClock::time_point lastMoved = TClock::now();
  pollfd waiting{child.Output(), POLLIN, 0};
  while (true) {
    if (::poll(&waiting, 1, kLookEveryMilliseconds) > 0) {
      if (!child.Read(report)) return true;
      continue;
    }
    std::uint64_t const now = BytesMoved(watch, file, child.Id());
    if (watch.fShowProgress) watch.fShowProgress(now);
    if (now != last) lastMoved = TClock::now();
    last = now;
    if (watch.fStallSeconds > 0 && TClock::now() - lastMoved > std::chrono::seconds(watch.fStallSeconds)) return false;
  }
}

}  // namespace

TOutcome RunWatched(std::function<TZEPStatusCode()> const& transfer, TWatch const& watch) {
  TChildProcess child([&] { return ReportOfSilent(transfer); }, SIGKILL);  // a transfer does not outlive zep
  std::string report;
  if (!ReadReport(child, watch, report)) return Stalled(watch);
  child.End();
  return OutcomeOf(report, watch);
}

}  // namespace NQRVZEP20::zep
