// SPDX-License-Identifier: Apache-2.0
#include "KernelLog.h"

#include "core/Handles.h"

#include <fcntl.h>
#include <unistd.h>

#include <algorithm>
#include <array>
#include <cerrno>
#include <cstring>
#include <deque>
#include <functional>
#include <utility>

namespace NQRVZEP20 {

namespace {

constexpr char const* kPath = "/dev/kmsg";
constexpr char const* kAnswer = "kmsg";

// Collects the events of records that are given to it in the order of the log.
class TCollector {
public:
  // `record`: the first line of the record.
  void Add(std::string_view record) {
    auto message = KernelMessageFrom(record);
    if (!message) return void(++fLog.fUnreadable);
    ++fLog.fRecords;
    if (message->fNumber > fNext) fLog.fGone += message->fNumber - fNext;
    fNext = message->fNumber + 1;
    auto event = KernelEventFrom(std::move(*message));
    if (event) Keep(std::move(*event));
  }

  TKernelLog Finish(bool isWhole) {
    fLog.fIsWhole = isWhole;
    for (auto& events : fEvents)
      for (TKernelEvent& event : events) fLog.fEvents.push_back(std::move(event));
    std::stable_sort(fLog.fEvents.begin(), fLog.fEvents.end(), [](TKernelEvent const& one, TKernelEvent const& other) {
      return one.fMessage.fNumber < other.fMessage.fNumber;
    });
    return std::move(fLog);
  }

private:
  void Keep(TKernelEvent event) {
    auto& events = fEvents.at(event.fKind - 1);
    events.push_back(std::move(event));
    if (events.size() <= kMostKernelEvents) return;
    events.pop_front();
    ++fLog.fLeftOut;
  }

  TKernelLog fLog;
  std::uint64_t fNext = 0;  // the number that the next record has if none was overwritten
  std::array<std::deque<TKernelEvent>, TKernelEvent::kKinds> fEvents;
};

// A reason, also if the system has no such device: then errors in the log are unknown.
TMissing WhyUnreadable(int error) {
  if (error == ENOENT) return {kMissingUnreadable, "/dev/kmsg does not exist, as in most containers"};
  if ((error == EACCES || error == EPERM) && ::geteuid() != 0) return {kMissingNeedsRoot, "only root may read /dev/kmsg"};
  return {kMissingUnreadable, std::string("/dev/kmsg cannot be read: ") + std::strerror(error)};
}

std::string_view FirstLine(std::string_view text) { return text.substr(0, text.find('\n')); }

// Calls `use` with the first line of each record. Returns whether the whole log was read within the time limit. Each read returns
// one record. EPIPE: the next record was overwritten meanwhile, and reading goes on after the gap.
TFinding<bool> ReadDevice(std::chrono::milliseconds limit, std::function<void(std::string_view)> const& use) {
  auto const end = std::chrono::steady_clock::now() + limit;
  TUniqueFd const device(::open(kPath, O_RDONLY | O_NONBLOCK | O_CLOEXEC | O_NOCTTY));
  if (!device) return WhyUnreadable(errno);
  ::lseek(device.get(), 0, SEEK_DATA);  // after the last clearing; otherwise reading begins at the oldest record
  std::string buffer(8192, '\0');       // the kernel's longest record
  while (std::chrono::steady_clock::now() < end) {
    ssize_t const size = ::read(device.get(), buffer.data(), buffer.size());
    if (size > 0) {
      use(FirstLine({buffer.data(), static_cast<std::size_t>(size)}));
    } else if (size == 0 || errno == EAGAIN) {
      return true;
    } else if (errno != EPIPE && errno != EINTR) {
      return WhyUnreadable(errno);
    }
  }
  return false;
}

TFinding<TKernelLog> ReadThisMachine(std::chrono::milliseconds limit) {
  TCollector log;
  return ReadDevice(limit, [&](std::string_view line) { log.Add(line); }).Then([&](bool isWhole) { return log.Finish(isWhole); });
}

// The whole log, for a recording.
TFinding<std::string> ReadText(std::chrono::milliseconds limit) {
  std::string text;
  auto const isWhole = ReadDevice(limit, [&](std::string_view line) { text.append(line) += '\n'; });
  return isWhole.Then([&](bool whole) -> TFinding<std::string> {
    if (whole) return text;
    return TMissing{kMissingUnreadable, "the kernel's log could not be recorded within the time limit"};
  });
}

}  // namespace

TFinding<TKernelLog> ReadKernelLog(TMachineFiles const& files, std::chrono::milliseconds limit) {
  if (files.IsThisMachine() && !files.IsBeingRecorded()) return ReadThisMachine(limit);
  if (files.IsThisMachine() || files.HasAnswer(kAnswer))
    return files.Answer(kAnswer, [limit] { return ReadText(limit); }).Then(KernelLogFrom);
  auto const records = files.Content(kPath, kMostKernelBytes);
  if (!records && records.Why().fCode == kMissingNotGiven) return WhyUnreadable(ENOENT);
  return records.Then(KernelLogFrom);
}

TKernelLog KernelLogFrom(std::string_view records) {
  TCollector log;
  while (!records.empty()) {
    std::string_view const line = FirstLine(records);
    if (!line.empty() && line.front() != ' ') log.Add(line);
    records.remove_prefix(std::min(line.size() + 1, records.size()));
  }
  return log.Finish(true);
}

}  // namespace NQRVZEP20
