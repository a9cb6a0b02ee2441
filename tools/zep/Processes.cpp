#include "Processes.h"

#include <errno.h>
#include <fcntl.h>
#include <poll.h>
#include <signal.h>
#include <sys/prctl.h>
#include <sys/wait.h>
#include <unistd.h>

#include <algorithm>
#include <chrono>
#include <system_error>
#include <utility>

namespace NQRVZEP20::zep {

namespace {

using TClock = std::chrono::steady_clock;

[[noreturn]] void ThrowSystemError(char const* what) { throw std::system_error(errno, std::system_category(), what); }

bool WriteWhole(int fd, std::string const& text) {
  for (std::size_t written = 0; written < text.size();) {
    ssize_t const now = ::write(fd, text.data() + written, text.size() - written);
    if (now < 0) return false;
    written += static_cast<std::size_t>(now);
  }
  return true;
}

// The child's part. It ends with its parent, and without the parent's clean-up.
[[noreturn]] void RunWork(std::size_t item, int output, std::function<std::string(std::size_t)> const& work) {
  ::prctl(PR_SET_PDEATHSIG, SIGTERM);
  bool isWritten = false;
  try {
    isWritten = WriteWhole(output, work(item));
  } catch (...) {
    // The parent sees that the end is missing.
  }
  ::_exit(isWritten ? 0 : 1);
}

class TProcess {
public:
  TProcess(std::size_t item, TClock::time_point deadline, std::function<std::string(std::size_t)> const& work)
      : fDeadline(deadline), fResult{item, false, false, {}} {
    int ends[2];
    if (::pipe2(ends, O_CLOEXEC) != 0) ThrowSystemError("no pipe for a process");
    fOutput = ends[0];
    fChild = ::fork();
    if (fChild == 0) RunWork(item, ends[1], work);
    int const error = errno;
    ::close(ends[1]);
    errno = error;
    if (fChild < 0) {
      ::close(fOutput);
      ThrowSystemError("no process");
    }
  }
  TProcess(TProcess&& other) noexcept
      : fDeadline(other.fDeadline),
        fResult(std::move(other.fResult)),
        fOutput(std::exchange(other.fOutput, -1)),
        fChild(std::exchange(other.fChild, -1)) {}
  TProcess& operator=(TProcess&& other) noexcept {
    std::swap(fDeadline, other.fDeadline);
    std::swap(fResult, other.fResult);
    std::swap(fOutput, other.fOutput);
    std::swap(fChild, other.fChild);
    return *this;
  }
  // One that still runs is ended.
  ~TProcess() {
    if (fChild > 0) ::kill(fChild, SIGKILL);
    Wait();
  }

  int Output() const { return fOutput; }
  TClock::time_point Deadline() const { return fDeadline; }
  TProcessResult const& Result() const { return fResult; }

  // Takes what is there. False at the end.
  bool Read() {
    char chunk[4096];
    ssize_t const got = ::read(fOutput, chunk, sizeof chunk);
    if (got < 0 && errno == EINTR) return true;
    if (got <= 0) return false;
    fResult.fOutput.append(chunk, static_cast<std::size_t>(got));
    return true;
  }

  void End() { fResult.fIsComplete = Wait() == 0; }

  void EndBecauseTimeIsUp() {
    ::kill(fChild, SIGKILL);
    Wait();
    fResult.fIsTimeUp = true;
  }

private:
  // What waitpid tells; -1 when there is nothing to wait for.
  int Wait() {
    int status = -1;
    if (fChild > 0) {
      while (::waitpid(fChild, &status, 0) < 0 && errno == EINTR) {
      }
    }
    fChild = -1;
    if (fOutput >= 0) ::close(fOutput);
    fOutput = -1;
    return status;
  }

  TClock::time_point fDeadline;
  TProcessResult fResult;
  int fOutput = -1;
  pid_t fChild = -1;  // -1: waited for
};

// Waits until one of the processes says something, or the time of one is up.
std::vector<pollfd> WaitForAny(std::vector<TProcess> const& running) {
  std::vector<pollfd> polled;
  TClock::time_point next = TClock::time_point::max();
  for (TProcess const& process : running) {
    polled.push_back({process.Output(), POLLIN, 0});
    next = std::min(next, process.Deadline());
  }
  auto const wait = std::chrono::ceil<std::chrono::milliseconds>(next - TClock::now()).count();
  if (::poll(polled.data(), polled.size(), static_cast<int>(std::clamp<long>(wait, 0, 3600000))) < 0)
    for (pollfd& one : polled) one.revents = 0;
  return polled;
}

}  // namespace

void RunInProcesses(std::size_t count, TProcessLimits const& limits, std::function<std::string(std::size_t)> const& work,
                    std::function<void(TProcessResult const&)> const& done) {
  std::vector<TProcess> running;
  for (std::size_t next = 0; next < count || !running.empty();) {
    while (next < count && running.size() < limits.fParallel) try {
        running.emplace_back(next, TClock::now() + std::chrono::seconds(limits.fTimeoutSeconds), work);
        ++next;
      } catch (std::system_error const&) {
        if (!running.empty()) break;  // there may be room again when one of them has ended
        done({next++, false, false, {}});
      }
    if (running.empty()) continue;

    std::vector<pollfd> const polled = WaitForAny(running);
    std::vector<TProcess> stillRunning;
    for (std::size_t n = 0; n < running.size(); ++n) {
      TProcess& process = running[n];
      if (polled[n].revents != 0 && !process.Read())
        process.End();
      else if (TClock::now() >= process.Deadline())
        process.EndBecauseTimeIsUp();
      else {
        stillRunning.push_back(std::move(process));
        continue;
      }
      done(process.Result());
    }
    running = std::move(stillRunning);
  }
}

}  // namespace NQRVZEP20::zep
