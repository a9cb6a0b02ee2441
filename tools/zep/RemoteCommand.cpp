// zep remote: the identity of remote servers, asked of their management controllers.

#include "Commands.h"
#include "Controller.h"
#include "ExitStatus.h"
#include "Failure.h"
#include "IIPMILan.h"
#include "Output.h"
#include "Password.h"
#include "Processes.h"
#include "TLogger.h"
#include "Terminal.h"
#include "Text.h"

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

struct TArguments {
  std::string fHost, fHostsFile, fUser, fPasswordFile, fDebugLog;
  int fParallel = 32;
  int fTimeoutSeconds = 30;
  bool fAsJson = false;
};

// The lines of the file that are neither empty nor comments, without blanks around them.
std::vector<std::string> HostsIn(std::string const& path) {
  errno = 0;
  std::ifstream file(path);
  std::vector<std::string> hosts;
  for (std::string line; std::getline(file, line);) {
    std::size_t const first = line.find_first_not_of(" \t\r");
    if (first == line.npos || line[first] == '#') continue;
    hosts.push_back(line.substr(first, line.find_last_not_of(" \t\r") + 1 - first));
  }
  bool const isRead = file.is_open() && !file.bad();  // to its end
  if (!isRead) throw std::runtime_error(Printable(path) + " cannot be read: " + std::strerror(errno));
  if (hosts.empty()) throw std::runtime_error(Printable(path) + " names no host");
  return hosts;
}

// The line on standard error that tells how far a list is. On a terminal it is written over and over, elsewhere once.
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

// Makes the file for nobody else to read, before the library opens it: it may come to hold passwords. Returns 0 or errno.
int MakePrivate(std::string const& path) {
  int const file = ::open(path.c_str(), O_WRONLY | O_CREAT | O_CLOEXEC, 0600);
  struct stat status {};
  bool const isFile = file >= 0 && ::fstat(file, &status) == 0 && S_ISREG(status.st_mode);  // and no terminal, say
  bool const isPrivate = file >= 0 && (!isFile || ::fchmod(file, 0600) == 0);
  int const error = isPrivate ? 0 : errno;
  if (file >= 0) ::close(file);
  return error;
}

void WriteDebugLog(std::string const& path) {
  int const error = MakePrivate(path);
  std::string failure = error != 0 ? std::strerror(error) : "";
  if (error == 0) failure = FailureOf([&] { TLogger::GetInstance()->SetLogFilename(path); });
  if (!failure.empty()) throw std::runtime_error("the debug log " + path + " cannot be written: " + failure);
  TLogger::SetLogThreshold(ILogger::kLogDebug);
}

void WarnOfPasswords() {
  if (TLogger::GetInstance()->GetLogThreshold() < ILogger::kLogDebug) return;
  std::cerr << "zep: warning: debug lines are logged, and the controller link writes passwords among them in clear text\n";
}

using TReport = std::function<void(TRemoteIdentity const&)>;

// Asks the controller of each host, and reports each as soon as it is known. Returns an EExitStatus.
int AskAll(std::vector<std::string> const& hosts, TAccount const& account, TArguments const& arguments, TReport const& report) {
  IIPMILan::Initialize()->IpmilanCloseConnect();  // loads the IPMI client library once, for all processes
  std::size_t complete = 0, nothing = 0;
  TProcessLimits const limits = {static_cast<std::size_t>(arguments.fParallel), arguments.fTimeoutSeconds};
  RunInProcesses(
      hosts.size(), limits, [&](std::size_t item) { return AskController(hosts[item], account); },
      [&](TProcessResult const& result) {
        TRemoteIdentity identity = IdentityFrom(hosts[result.fItem], result.fOutput, result.fIsComplete);
        if (result.fIsTimeUp) identity.fError = "not done after " + std::to_string(arguments.fTimeoutSeconds) + " s";
        complete += IsComplete(identity);
        nothing += IsNothing(identity);
        report(identity);
      });
  if (complete == hosts.size()) return kExitComplete;
  return nothing == hosts.size() ? kExitNothing : kExitPartial;
}

int AskOne(TAccount const& account, TArguments const& arguments) {
  return AskAll({arguments.fHost}, account, arguments, [&](TRemoteIdentity const& identity) {
    WriteOutput(arguments.fAsJson ? AsText(AsJson(identity)) : AsText(identity));
    if (!identity.fError.empty()) std::cerr << "zep: " << Printable(identity.fHost + ": " + identity.fError) << "\n";
  });
}

int AskList(std::vector<std::string> const& hosts, TAccount const& account, TArguments const& arguments) {
  TProgress progress(hosts.size());
  return AskAll(hosts, account, arguments, [&](TRemoteIdentity const& identity) {
    WriteOutput(AsLine(AsJson(identity)));
    progress.Count(!IsComplete(identity));
  });
}

int Remote(TArguments const& arguments) {
  if (arguments.fHost.empty() == arguments.fHostsFile.empty())
    throw TWrongUsage("name either a host or a file of hosts (--hosts)");
  std::vector<std::string> const hosts =
      arguments.fHostsFile.empty() ? std::vector<std::string>() : HostsIn(arguments.fHostsFile);
  if (!arguments.fDebugLog.empty()) WriteDebugLog(arguments.fDebugLog);
  WarnOfPasswords();
  TAccount const account = {arguments.fUser, ControllerPassword(arguments.fUser, arguments.fPasswordFile)};
  return arguments.fHostsFile.empty() ? AskOne(account, arguments) : AskList(hosts, account, arguments);
}

}  // namespace

TRun AddRemoteArguments(CLI::App& command) {
  auto const arguments = std::make_shared<TArguments>();
  command.add_option("host", arguments->fHost, "The controller's host name or address");
  command.add_option("--hosts", arguments->fHostsFile,
                     "Ask every host that this file names, one a line; print one JSON object a line");
  command.add_option("--user", arguments->fUser, "The account on the controllers")->required();
  command.add_option("--password-file", arguments->fPasswordFile, "The file whose first line is the account's password");
  command.add_option("--parallel", arguments->fParallel, "How many hosts of a file to ask at once")
      ->check(CLI::Range(1, 1000))
      ->capture_default_str();
  command.add_option("--timeout", arguments->fTimeoutSeconds, "The time for each host, in seconds")
      ->check(CLI::Range(1, 3600))
      ->capture_default_str();
  command.add_option("--debug-log", arguments->fDebugLog,
                     "Write what the library logs, debug lines too, to this file, for its\nowner only");
  command.add_flag("--json", arguments->fAsJson, "Print one JSON document");
  command.footer(
      "Asks the management controller of a server for machine type, model and serial number, over IPMI on the LAN (UDP\n"
      "port 623). The password comes from --password-file, else from the environment variable ZEP_BMC_PASSWORD, else it\n"
      "is asked for; there is no option for it, because others see a command line.\n"
      "Exit status: 0 when everything was told, 2 when something is missing, 1 when nothing was told, 64 for wrong usage.");
  return [arguments] { return Remote(*arguments); };
}

}  // namespace NQRVZEP20::zep
