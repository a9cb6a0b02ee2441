// SPDX-License-Identifier: Apache-2.0
#include "tools/zep/controller/ControllerSession.h"

#include "IIPMILan.h"
#include "TLogger.h"
#include "tools/zep/controller/Controller.h"
#include "tools/zep/output/Failure.h"

#include <sys/mman.h>
#include <unistd.h>

#include <charconv>
#include <optional>
#include <thread>

namespace NQRVZEP20::zep {

namespace {

// What OpenConnection of libipmiClient.so returns; the numbers are those of its header, which belongs to the platform. The
// library answers with two codes of its own where it cannot call it.
struct TReason {
  int fCode;
  char const* fText;
};

constexpr TReason kReasons[] = {
    {1, "it refuses the password"},
    {2, "it knows no such user, or the account is disabled"},
    {3, "it gives no answer"},
    {4, "the host name has no address"},
    {5, "nothing can be sent there"},
    {6, "it has no session left"},
    {7, "the account may not be administrator, or there is no cipher suite in common"},
    {8, "the user name or the password cannot be used; it may be too long"},
    {10, "it did not carry a command out"},
    {kZEPStatusFileSystemError,
     "libipmiClient.so cannot be loaded (install the package libzepcore-ipmi), or has no memory left"},  // 11
    {12, "its answers make no sense"},
    {kZEPStatusNotFound, "libipmiClient.so lacks a function"},  // 15
};

std::string ReasonOf(int code) {
  for (TReason const& reason : kReasons)
    if (reason.fCode == code) return reason.fText;
  return "code " + std::to_string(code) + " of libipmiClient.so";
}

// A file without a name, in memory that nobody else reads, for a log that has the password in it.
class TSecretFile {
public:
  TSecretFile() : fFile(::memfd_create("zep", MFD_CLOEXEC)) {}
  ~TSecretFile() {
    if (fFile >= 0) ::close(fFile);
  }
  TSecretFile(TSecretFile const&) = delete;
  TSecretFile& operator=(TSecretFile const&) = delete;

  std::string Path() const { return "/proc/self/fd/" + std::to_string(fFile); }

  std::string Text() const {
    std::string text;
    char chunk[4096];
    for (ssize_t got = 0; (got = ::pread(fFile, chunk, sizeof chunk, static_cast<off_t>(text.size()))) > 0;)
      text.append(chunk, static_cast<std::size_t>(got));
    return text;
  }

private:
  int const fFile;
};

// Debug lines are logged while it lives.
class TDebugLines {
public:
  TDebugLines() : fBefore(TLogger::GetInstance()->GetLogThreshold()) { TLogger::SetLogThreshold(ILogger::kLogDebug); }
  ~TDebugLines() { TLogger::SetLogThreshold(fBefore); }
  TDebugLines(TDebugLines const&) = delete;
  TDebugLines& operator=(TDebugLines const&) = delete;

private:
  ILogger::EZEPLogSeverity const fBefore;
};

// The code in the last line that has one.
std::optional<int> CodeIn(std::string const& log) {
  std::string const words = " Connection Error code:";
  std::size_t const at = log.rfind(words);
  int code = 0;
  if (at == log.npos) return std::nullopt;
  char const* const digits = log.data() + at + words.size();
  return std::from_chars(digits, log.data() + log.size(), code).ec == std::errc() ? std::optional(code) : std::nullopt;
}

}  // namespace

std::string WhyNoSession(std::string const& host, TAccount const& account) {
  TSecretFile const log;
  bool isOpen = false;
  std::string failure;
  // The link tells the code to the log only, and the password with it: to that of a thread, which is another one.
  std::thread([&] {
    TDebugLines const lines;
    FailureOf([&] { TLogger::GetInstance()->SetLogFilename(log.Path()); });
    std::string const password = account.fPassword.ForLibrary();
    failure = FailureOf([&] { isOpen = IIPMILan::GetInstance()->IpmilanOpenConnect(host, account.fUser, password); });
  }).join();
  if (isOpen) return "";
  if (!failure.empty()) return failure;
  std::optional<int> const code = CodeIn(log.Text());
  return code ? ReasonOf(*code) : "it gave no answer or refused the account, or libipmiClient.so is missing";
}

}  // namespace NQRVZEP20::zep
