// SPDX-License-Identifier: Apache-2.0

// zep remote: the identity of remote servers, from their management controllers.

#include "IIPMILan.h"
#include "TLogger.h"
#include "core/Handles.h"
#include "tools/zep/commands/Commands.h"
#include "tools/zep/commands/Thresholds.h"
#include "tools/zep/controller/Controller.h"
#include "tools/zep/output/ExitStatus.h"
#include "tools/zep/output/Failure.h"
#include "tools/zep/output/Output.h"
#include "tools/zep/output/Terminal.h"
#include "tools/zep/output/Text.h"
#include "tools/zep/processes/Processes.h"
#include "tools/zep/secrets/Password.h"
#include "tools/zep/secrets/Secrets.h"

#include <fcntl.h>
#include <sys/stat.h>
#include <unistd.h>
#include <CLI/CLI.hpp>

#include <cerrno>
#include <chrono>
#include <cstring>
#include <fstream>
#include <iostream>
#include <memory>

namespace NQRVZEP20::zep {

namespace {

using namespace std::string_literals;

struct TRemoteArguments {
  std::string fHost, fHostsFile, fUser, fPasswordFile, fDebugLog;
  int fParallel = 32;
  int fTimeoutSeconds = 120;
  bool fAsJson = false;
  bool fHasInventory = false;
};

// The lines of the file that are neither empty nor comments, without blanks around them. A line that is not a host may contain a
// password, so it is replaced by its line number.
std::vector<std::string> HostsIn(std::string const& path) {
  errno = 0;
  std::ifstream file(path);
  std::vector<std::string> hosts;
  std::size_t number = 0;
  for (std::string line; std::getline(file, line);) {
    ++number;
    std::size_t const first = line.find_first_not_of(" \t\r");
    if (first == line.npos || line[first] == '#') continue;
    std::string const host = line.substr(first, line.find_last_not_of(" \t\r") + 1 - first);
    hosts.push_back(IsHostName(host) ? host : "line " + std::to_string(number) + " of " + Printable(path));
  }
  bool const isRead = file.is_open() && !file.bad();  // to its end
  if (!isRead) throw std::runtime_error(Printable(path) + " cannot be read: " + std::strerror(errno));
  if (hosts.empty()) throw std::runtime_error(Printable(path) + " contains no host");
  return hosts;
}

// The progress line on standard error. On a terminal it is overwritten; otherwise it is printed once, at the end.
class TProgress {
public:
  explicit TProgress(std::size_t hosts) : fHosts(hosts), fIsTerminal(CanRedrawErrors()) {}

  void Count(bool isFailure) {
    ++fDone;
    fFailed += isFailure;
    auto const now = std::chrono::steady_clock::now();
    if (fDone < fHosts && (!fIsTerminal || now - fLast < std::chrono::milliseconds(100))) return;
    fLast = now;
    std::cerr << (fIsTerminal ? "\r" : "") << "zep: " << fDone << " of " << fHosts << " hosts done, " << fFailed << " failed"
              << (fDone == fHosts ? "\n" : "") << std::flush;
  }

private:
  std::size_t const fHosts;
  bool const fIsTerminal;
  std::size_t fDone = 0, fFailed = 0;
  std::chrono::steady_clock::time_point fLast;
};

// Why users other than the caller might read the open file; empty when only the caller can. The file may contain passwords
// later.
std::string WhyNotPrivate(int file) {
  struct stat status {};
  if (::fstat(file, &status) != 0) return std::strerror(errno);
  if (!S_ISREG(status.st_mode)) return "it is not a regular file";
  if (status.st_uid != ::geteuid()) return "it belongs to another user";
  if (status.st_nlink != 1) return "it has more than one hard link";
  if (::fchmod(file, 0600) != 0) return std::strerror(errno);
  bool const isClosed = ::fstat(file, &status) == 0 && (status.st_mode & 0077) == 0;
  return isClosed ? "" : "its file system allows other users to read it";
}

std::string WhyNotOpened(int error) {
  if (error == ELOOP) return "it is a symbolic link";
  return error == ENXIO ? "it is not a regular file" : std::strerror(error);
}

// The library opens the file that was checked here, even when the path leads elsewhere by then.
void WriteDebugLog(std::string const& path) {
  static TUniqueFd file;  // to the end of the program
  file = TUniqueFd(::open(path.c_str(), O_WRONLY | O_CREAT | O_NOFOLLOW | O_NONBLOCK | O_NOCTTY | O_CLOEXEC, 0600));
  std::string failure = file ? WhyNotPrivate(file.get()) : WhyNotOpened(errno);
  std::string const sameFile = "/proc/self/fd/" + std::to_string(file.get());
  if (failure.empty()) failure = FailureOf([&] { TLogger::GetInstance()->SetLogFilename(sameFile); });
  if (!failure.empty()) throw std::runtime_error("the debug log " + path + " cannot be written: " + failure);
  TLogger::SetLogThreshold(ILogger::kLogDebug);
}

// A tenth of the time remains for sending what was read.
TInventoryLimits InventoryLimitsOf(TRemoteArguments const& arguments) {
  return {std::chrono::milliseconds(900) * arguments.fTimeoutSeconds, !arguments.fHost.empty() && CanRedrawErrors()};
}

using TReportHost = std::function<void(TRemoteIdentity const&)>;

// Asks the controller of each host, and reports each as soon as it is known. Returns an EExitStatus.
int AskAll(std::vector<std::string> const& hosts, TAccount const& account, TRemoteArguments const& arguments,
           TReportHost const& report) {
  IIPMILan::Initialize()->IpmilanCloseConnect();  // loads the IPMI client library once, for all processes
  std::size_t complete = 0, nothing = 0;
  TInventoryLimits const inventory = InventoryLimitsOf(arguments);
  TProcessLimits const limits = {static_cast<std::size_t>(arguments.fParallel), arguments.fTimeoutSeconds};
  RunInProcesses(
      hosts.size(), limits,
      [&](std::size_t item, TSend const& send) {
        QueryController(hosts[item], account, arguments.fHasInventory ? &inventory : nullptr, send);
      },
      [&](TProcessResult const& result) {
        TRemoteIdentity identity = IdentityFrom(hosts[result.fItem], result.fOutput, result.fIsComplete, arguments.fHasInventory);
        if (result.fIsTimeUp)
          identity.fError = "no result after " + std::to_string(arguments.fTimeoutSeconds) + " s; --timeout allows more";
        complete += IsComplete(identity);
        nothing += IsNothing(identity);
        report(identity);
      });
  if (complete == hosts.size()) return kExitComplete;
  return nothing == hosts.size() ? kExitNothing : kExitPartial;
}

int AskOne(TAccount const& account, TRemoteArguments const& arguments, TThresholds const& thresholds) {
  return AskAll({arguments.fHost}, account, arguments, [&](TRemoteIdentity const& identity) {
    WriteOutput(arguments.fAsJson ? zep::AsText(AsJson(identity, thresholds)) : AsText(identity, thresholds));
    if (!identity.fError.empty()) std::cerr << "zep: " << Printable(identity.fHost + ": " + identity.fError) << "\n";
  });
}

int AskList(std::vector<std::string> const& hosts, TAccount const& account, TRemoteArguments const& arguments,
            TThresholds const& thresholds) {
  TProgress progress(hosts.size());
  return AskAll(hosts, account, arguments, [&](TRemoteIdentity const& identity) {
    WriteOutput(AsLine(AsJson(identity, thresholds)));
    progress.Count(!IsComplete(identity));
  });
}

// "--user admin:secret" has a password in the wrong place.
void HideAfterColon(std::string const& user) {
  std::size_t const colon = user.find(':');
  if (colon != user.npos) TSecret const hidden(std::string_view(user).substr(colon + 1));
}

int Remote(TRemoteArguments const& arguments) {
  if (arguments.fHost.empty() == arguments.fHostsFile.empty())
    throw TWrongUsage("either a host or a file of hosts (--hosts) is required");
  if (!arguments.fHost.empty() && !IsHostName(arguments.fHost)) throw TWrongUsage("the host is "s + kNoHostName);
  HideAfterColon(arguments.fUser);
  std::vector<std::string> const hosts =
      arguments.fHostsFile.empty() ? std::vector<std::string>() : HostsIn(arguments.fHostsFile);
  if (!arguments.fDebugLog.empty()) WriteDebugLog(arguments.fDebugLog);
  TAccount const account = {arguments.fUser, ControllerPassword(arguments.fUser, arguments.fPasswordFile)};
  TThresholds const thresholds = arguments.fHasInventory ? ThresholdSettings() : TThresholds();
  return arguments.fHostsFile.empty() ? AskOne(account, arguments, thresholds) : AskList(hosts, account, arguments, thresholds);
}

}  // namespace

TRun AddRemoteArguments(CLI::App& command) {
  auto const arguments = std::make_shared<TRemoteArguments>();
  command.add_option("host", arguments->fHost, "The controller's host name or address");
  command.add_option("--hosts", arguments->fHostsFile,
                     "Query the hosts in this file, one per line, and print one JSON document per line");
  command.add_option("--user", arguments->fUser, "The account on the controllers")->required();
  command.add_option("--password-file", arguments->fPasswordFile, "The file whose first line is the account's password");
  command.add_option("--parallel", arguments->fParallel, "The number of hosts to query at the same time")
      ->check(CLI::Range(1, 1000))
      ->capture_default_str();
  command.add_option("--timeout", arguments->fTimeoutSeconds, "The time limit for each host, in seconds")
      ->check(CLI::Range(1, 3600))
      ->capture_default_str();
  command.add_option("--debug-log", arguments->fDebugLog,
                     "Write the library's log, including debug lines, to this file, which only\nits owner can read");
  command.add_flag("--inventory", arguments->fHasInventory,
                   "Read the controller, its sensors, its event log and its FRU data, too");
  command.add_flag("--json", arguments->fAsJson, "Print one JSON document");
  command.footer(
      "Queries the management controller of a server for machine type, model and serial number, over IPMI on the LAN (UDP\n"
      "port 623). The password comes from --password-file, otherwise from the environment variable ZEP_BMC_PASSWORD,\n"
      "otherwise from a prompt; there is no option for it, because other users can read command lines.\n"
      "Exit status: 0 when everything is known, 2 when something is missing, 1 when nothing is known, 64 for wrong usage.");
  return [arguments] { return Remote(*arguments); };
}

}  // namespace NQRVZEP20::zep
