// SPDX-License-Identifier: Apache-2.0
#include "tools/zep/processes/Processes.h"

#include <poll.h>
#include <signal.h>

#include <algorithm>
#include <chrono>
#include <system_error>
#include <utility>

namespace NQRVZEP20::zep {

namespace {

using TClock = std::chrono::steady_clock;

// A process that works on an item.
struct TProcess {
  TChildProcess fChild;
  TClock::time_point fDeadline;
  TProcessResult fResult;
};

// Waits until one of the processes writes output or reaches its time limit.
std::vector<pollfd> WaitForAny(std::vector<TProcess> const& running) {
  std::vector<pollfd> polled;
  TClock::time_point next = TClock::time_point::max();
  for (TProcess const& process : running) {
    polled.push_back({process.fChild.Output(), POLLIN, 0});
    next = std::min(next, process.fDeadline);
  }
  auto const wait = std::chrono::ceil<std::chrono::milliseconds>(next - TClock::now()).count();
  if (::poll(polled.data(), polled.size(), static_cast<int>(std::clamp<long>(wait, 0, 3600000))) < 0)
    for (pollfd& one : polled) one.revents = 0;
  return polled;
}

// False when it has ended, which it may have when output is readable; its result is complete then.
bool GoesOn(TProcess& process, bool saysSomething) {
  if (saysSomething && !process.fChild.Read(process.fResult.fOutput)) {
    process.fResult.fIsComplete = process.fChild.End();
    return false;
  }
  if (TClock::now() < process.fDeadline) return true;
  process.fChild.Kill();
  process.fResult.fIsTimeUp = true;
  return false;
}

// The items in progress, and how many have been started.
class TItems {
public:
  using TDone = std::function<void(TProcessResult const&)>;

  TItems(std::size_t count, TProcessLimits const& limits, TWork const& work, TDone const& done)
      : fCount(count), fLimits(limits), fWork(work), fDone(done) {}

  // Starts as many as allowed, or as possible. When none can be started although no other is running, the item is finished.
  void TakeUp() {
    while (fNext < fCount && fRunning.size() < fLimits.fParallel) try {
        Start(fNext);
        ++fNext;
      } catch (std::system_error const&) {
        if (!fRunning.empty()) return;  // another may be possible when one of them has ended
        fDone({fNext++, false, false, {}});
      }
  }

  bool IsAnyRunning() const { return !fRunning.empty(); }

  // Waits for an event of a running process, and passes on the results of those that have ended.
  void Follow() {
    std::vector<pollfd> const polled = WaitForAny(fRunning);
    std::vector<TProcess> stillRunning;
    for (std::size_t n = 0; n < fRunning.size(); ++n) {
      TProcess& process = fRunning[n];
      if (GoesOn(process, polled[n].revents != 0))
        stillRunning.push_back(std::move(process));
      else
        fDone(process.fResult);
    }
    fRunning = std::move(stillRunning);
  }

private:
  void Start(std::size_t item) {
    TClock::time_point const deadline = TClock::now() + std::chrono::seconds(fLimits.fTimeoutSeconds);
    fRunning.push_back(
        {TChildProcess([&](TSend const& send) { fWork(item, send); }, SIGTERM), deadline, {item, false, false, {}}});
  }

  std::size_t const fCount;
  TProcessLimits const fLimits;
  TWork const& fWork;
  TDone const& fDone;
  std::size_t fNext = 0;
  std::vector<TProcess> fRunning;
};

}  // namespace

void RunInProcesses(std::size_t count, TProcessLimits const& limits, TWork const& work,
                    std::function<void(TProcessResult const&)> const& done) {
  TItems items(count, limits, work, done);
  for (items.TakeUp(); items.IsAnyRunning(); items.TakeUp()) items.Follow();
}

}  // namespace NQRVZEP20::zep
