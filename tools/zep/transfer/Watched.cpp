// SPDX-License-Identifier: Apache-2.0
#include "tools/zep/transfer/Watched.h"

#include "TZEPFailure.h"
#include "tools/zep/output/Text.h"
#include "tools/zep/processes/Interrupts.h"
#include "tools/zep/processes/TChildProcess.h"
#include "tools/zep/secrets/Secrets.h"

#include <fcntl.h>
#include <poll.h>
#include <signal.h>
#include <sys/resource.h>
#include <sys/stat.h>
#include <unistd.h>

#include <algorithm>
#include <chrono>
#include <filesystem>
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

std::string ReportText(TZEPStatusCode const& status, std::string const& reason) {
  return std::to_string(status.GetCode()) + " " + reason;
}

// The report of the child: the status as a number, a space, and the reason, which may be empty.
std::string ReportOf(std::function<TZEPStatusCode()> const& transfer) {
  try {
    return ReportText(transfer(), "");
  } catch (TZEPFailure const& failure) {
    return ReportText(failure.GetStatusCode(), failure.Reason());
  } catch (TZEPException const& failure) {
    return ReportText(failure.GetStatusCode(), "");
  } catch (std::exception const& failure) {
    return ReportText(kZEPStatusFail, failure.what());
  }
}

// Lets every write fail that would make a file larger than that.
void LimitFiles(std::uint64_t most) {
  rlimit const limit{most, most};
  ::signal(SIGXFSZ, SIG_IGN);
  ::setrlimit(RLIMIT_FSIZE, &limit);
}

std::string ReportOfSilent(std::function<TZEPStatusCode()> const& transfer, std::uint64_t mostBytes) {
  if (mostBytes > 0) LimitFiles(mostBytes);
  TUniqueFd const nowhere(::open("/dev/null", O_RDWR));
  ::dup2(nowhere.get(), STDIN_FILENO);
  ::dup2(nowhere.get(), STDOUT_FILENO);
  return ReportOf(transfer);
}

// ---- In zep ----

std::uint64_t BytesMoved(TWatch const& watch) {
  if (watch.fMoved != nullptr) return *watch.fMoved;
  std::error_code absent;
  std::uintmax_t const size = fs::file_size(watch.fFile, absent);
  return absent ? 0 : size;
}

// Names the package to install if libcurl itself is missing, and not only one of its functions.
std::string RemedyFor(std::string const& reason) {
  bool const isMissing = reason.find("Error opening curl library: ") != reason.npos;
  return isMissing ? "; install the package libcurl4" : "";
}

bool EndsWith(std::string const& text, std::string const& end) {
  return text.size() >= end.size() && text.compare(text.size() - end.size(), end.size(), end) == 0;
}

TOutcome OutcomeOf(std::string const& report) {
  std::size_t const blank = report.find(' ');
  if (blank == report.npos) return {kZEPStatusFail, kExitNothing, "the process of the transfer ended without a result"};
  TZEPStatusCode const status(static_cast<EZEPStatusCode>(std::stoi(report.substr(0, blank))));
  if (status == kZEPStatusOK) return {status, kExitComplete, ""};
  std::string reason = Printable(MessageWithoutSecrets(report.substr(blank + 1)));
  if (EndsWith(reason, ": ")) reason += "libcurl reports no reason";
  reason += RemedyFor(reason);
  return {status, ExitStatusOf(status), reason.empty() ? status.TranslateStatusCode() : reason};
}

TOutcome Stalled(TWatch const& watch) {
  return {kZEPStatusTransferFailure, kExitStalled, "no progress for " + std::to_string(watch.fStallSeconds) + " s"};
}

// Reads the report until the child has ended. Returns false if the transfer stalls or an interrupt is pending.
bool ReadReport(TChildProcess& child, TWatch const& watch, std::string& report) {
  std::uint64_t last = BytesMoved(watch);
  TClock::time_point lastMoved = TClock::now();
  pollfd waiting{child.Output(), POLLIN, 0};
  while (true) {
    if (PendingInterrupt() != 0) return false;
    if (::poll(&waiting, 1, kLookEveryMilliseconds) > 0) {
      if (!child.Read(report)) return true;
      continue;
    }
    std::uint64_t const now = BytesMoved(watch);
    if (watch.fShowProgress) watch.fShowProgress(now);
    bool const isFinishing = watch.fIsFinishing != nullptr && *watch.fIsFinishing;
    if (now != last || isFinishing) lastMoved = TClock::now();
    last = now;
    if (watch.fStallSeconds > 0 && TClock::now() - lastMoved > std::chrono::seconds(watch.fStallSeconds)) return false;
  }
}

}  // namespace

TOutcome Interrupted() { return {kZEPStatusFail, StatusOfInterrupt(), "interrupted"}; }

TOutcome RunWatched(std::function<TZEPStatusCode()> const& transfer, TWatch const& watch) {
  TChildProcess child([&] { return ReportOfSilent(transfer, watch.fMostBytes); }, SIGKILL);  // it does not outlive zep
  std::string report;
  if (!ReadReport(child, watch, report)) return PendingInterrupt() != 0 ? Interrupted() : Stalled(watch);
  bool const isWhole = child.End();
  if (!isWhole && PendingInterrupt() != 0) return Interrupted();  // the signal may have ended the child, too
  return OutcomeOf(report);
}

}  // namespace NQRVZEP20::zep
