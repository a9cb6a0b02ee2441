// SPDX-License-Identifier: Apache-2.0
#include "collect/process/TPlugInProcess.h"

#include "collect/process/Children.h"
#include "collect/process/LogLines.h"
#include "collect/process/PlugInChild.h"
#include "collect/process/SignalText.h"

#include <signal.h>
#include <sys/wait.h>
#include <unistd.h>

#include <algorithm>
#include <array>
#include <cerrno>
#include <cstdio>
#include <cstring>
#include <iostream>
#include <system_error>

namespace NQRVZEP20 {

namespace {

constexpr std::size_t kMostWords = 4096;                // kept of either end
constexpr std::size_t kMostLog = 16u * 1024 * 1024;     // the last line is kept of a longer log, too
constexpr std::chrono::seconds kGrace(5);               // for a process whose pipe is closed to end by itself
constexpr std::chrono::seconds kTimeToEnd(10);          // for a supervisor to end everything
constexpr std::chrono::milliseconds kTimeToReact(200);  // for a supervisor, before its state is looked at
constexpr int kMostDrains = 64;                         // mebibytes that a pipe may still hold at the end

// Reads what has arrived, up to a mebibyte, and passes it on. Closes the descriptor at the end of the pipe.
template <class TTake>
void ReadFrom(TUniqueFd& fd, TTake take) {
  std::array<char, 64 * 1024> bytes;
  for (int pieces = 0; fd && pieces < 16; ++pieces) {
    ssize_t const count = ::read(fd.get(), bytes.data(), bytes.size());
    if (count < 0 && errno == EINTR) continue;
    if (count < 0 && errno == EAGAIN) return;
    if (count <= 0) return fd.reset();
    take(std::string_view(bytes.data(), static_cast<std::size_t>(count)));
  }
}

pid_t ForkOrThrow() {
  std::cout.flush();  // a child must not write what is still in the buffers
  std::fflush(nullptr);
  pid_t const child = ::fork();
  if (child < 0) throw std::system_error(errno, std::generic_category(), "no process");
  return child;
}

TPlugInFailure Exceeded(std::string limit, std::string why) {
  TPlugInFailure failure{std::move(why)};
  failure.fCause.fLimit = std::move(limit);
  return failure;
}

// `status`: as waitpid returns it.
TPlugInFailure EndOf(int status) {
  TPlugInFailure failure;
  if (WIFEXITED(status)) {
    failure.fWhy = "it exited with status " + std::to_string(WEXITSTATUS(status));
    failure.fCause.fExitStatus = WEXITSTATUS(status);
  } else {
    failure.fWhy = "it was killed by " + SignalText(WTERMSIG(status));
    failure.fCause.fSignal = SignalName(WTERMSIG(status));
  }
  return failure;
}

bool HasInput(int fd, std::chrono::milliseconds wait) {
  pollfd waiting{fd, POLLIN, 0};
  return ::poll(&waiting, 1, static_cast<int>(wait.count())) > 0;
}

}  // namespace

TPlugInProcess::TPlugInProcess(std::string const& name, std::string const& file, TApartLimits const& limits,
                               std::string sampleLabel, bool measures)
    : fLimits(limits),
      fResult{name, file, 0, "", {}},
      fAnswer(name, file, limits, std::move(sampleLabel),
              [this] {
                ReadLog();  // the lines that were logged before the failure have arrived
                return LastLogLineOf(fLog);
              }),
      fWords(kMostWords) {
  Start(limits, measures);
  fDeadline = TClock::now() + std::chrono::seconds(limits.fTimeoutSeconds);
}

TPlugInProcess::~TPlugInProcess() {
  if (::getpid() != fOwner) return;
  fControl.reset();
  if (fVerdictEnd) HasInput(fVerdictEnd.get(), kTimeToEnd);
  EndSupervisor();
}

void TPlugInProcess::Start(TApartLimits const& limits, bool measures) {
  TPipe control = OpenPipe(), answer = OpenPipe(), words = OpenPipe(), log = OpenPipe(), verdict = OpenPipe();
  TChildSetup const setup{fResult.fName,
                          fResult.fFile,
                          answer.fWriteEnd.get(),
                          words.fWriteEnd.get(),
                          log.fWriteEnd.get(),
                          limits.fMemoryMebibytes * 1024 * 1024,
                          measures};
  TSupervisorEnds const ends{control.fReadEnd.get(), verdict.fWriteEnd.get()};
  std::function<void()> const work = [&] { RunPlugIn(setup); };
  fSupervisor = ForkOrThrow();
  if (fSupervisor == 0) {
    control.fWriteEnd.release();  // closed with all others, so that the end of the owner is seen
    Supervise(ends, work);
  }
  fControl = std::move(control.fWriteEnd);
  fAnswerEnd = std::move(answer.fReadEnd);
  fWordsEnd = std::move(words.fReadEnd);
  fLogEnd = std::move(log.fReadEnd);
  fVerdictEnd = std::move(verdict.fReadEnd);
}

void TPlugInProcess::AddTo(std::vector<pollfd>& polled) const {
  for (TUniqueFd const* const fd : {&fAnswerEnd, &fWordsEnd, &fLogEnd, &fVerdictEnd})
    if (*fd) polled.push_back({fd->get(), POLLIN, 0});
}

TPlugInProcess::TClock::time_point TPlugInProcess::NextDeadline() const {
  if (fGiveUpAt) return *fGiveUpAt;
  return fDeadline.value_or(TClock::time_point::max());
}

void TPlugInProcess::Grant(TClock::duration time) {
  if (fDeadline) *fDeadline += time;
  if (fGiveUpAt) *fGiveUpAt += time;
}

// The verdict is sent when no process of the plug-in is left: what the pipes hold then is all that will come.
void TPlugInProcess::Follow() {
  ReadVerdict();
  bool const hasVerdict = !fVerdictEnd;
  ReadAnswer();
  ReadWords();
  ReadLog();
  if (!hasVerdict) return CheckDeadlines();
  DrainAnswer();
  Complete();
}

// A process that has escaped may write for ever.
void TPlugInProcess::DrainAnswer() {
  for (int n = 0; n < kMostDrains && fAnswerEnd && fEnding == EEnding::kNone; ++n) {
    if (!HasInput(fAnswerEnd.get(), std::chrono::milliseconds(0))) return;
    ReadAnswer();
  }
}

// ---- Reading ----

void TPlugInProcess::ReadAnswer() {
  ReadFrom(fAnswerEnd, [&](std::string_view bytes) {
    if (fEnding != EEnding::kNone) return;  // dropped
    fAnswer.Add(bytes);
    if (fAnswer.HasLoaded()) StartFillTime();
    switch (fAnswer.State()) {
      case TPlugInAnswer::EState::kOpen:
        return;
      case TPlugInAnswer::EState::kDone:
        return End(EEnding::kDone);
      case TPlugInAnswer::EState::kTooLong:
        return End(EEnding::kTooLong);
      case TPlugInAnswer::EState::kBad:
        return End(EEnding::kBadAnswer);
    }
  });
  if (!fAnswerEnd && !fGiveUpAt) WaitUntil(std::min(TClock::now() + kGrace, NextDeadline()));
}

// Once.
void TPlugInProcess::StartFillTime() {
  if (fIsInFillTime) return;
  fIsInFillTime = true;
  fDeadline = TClock::now() + std::chrono::seconds(fLimits.fTimeoutSeconds);
}

void TPlugInProcess::ReadWords() {
  ReadFrom(fWordsEnd, [&](std::string_view text) { fWords.Add(text); });
}

void TPlugInProcess::ReadLog() {
  ReadFrom(fLogEnd, [&](std::string_view text) { AddToLog(fLog, text, kMostLog); });
}

void TPlugInProcess::ReadVerdict() {
  ReadFrom(fVerdictEnd, [&](std::string_view bytes) {
    TVerdict verdict;
    if (bytes.size() != sizeof verdict) return;
    std::memcpy(&verdict, bytes.data(), sizeof verdict);
    fVerdict = verdict;
  });
}

// ---- Ending ----

void TPlugInProcess::End(EEnding ending) {
  if (fEnding != EEnding::kNone) return;
  fEnding = ending;
  fControl.reset();
  WaitUntil(TClock::now() + kTimeToEnd);
}

// The supervisor has a moment to react.
void TPlugInProcess::WaitUntil(TClock::time_point time) {
  fGiveUpAt = time;
  fLookAt = TClock::now() + kTimeToReact;
}

// Nobody else stops it: it has a session of its own.
bool TPlugInProcess::IsSupervisorStopped() const {
  if (!fLookAt || TClock::now() < *fLookAt) return false;
  auto const state = StateOf(fSupervisor);
  return state && state->IsStopped();
}

void TPlugInProcess::CheckDeadlines() {
  if (IsSupervisorStopped()) {
    fHasStoppedSupervisor = true;
    return Complete();
  }
  if (TClock::now() < NextDeadline()) return;
  if (fEnding == EEnding::kNone) return End(fGiveUpAt ? EEnding::kClosed : EEnding::kTimeUp);
  Complete();  // the supervisor is stopped, or a process waits for a device and cannot be ended
}

void TPlugInProcess::Complete() {
  EndSupervisor();
  fAnswerEnd.reset();
  ReadWords();
  ReadLog();
  if (fEnding != EEnding::kDone || fHasStoppedSupervisor) fAnswer.Fail(WhyDead());
  fResult = fAnswer.Finish(fWords.Get());
  fHasEnded = true;
}

// It has given its word, or never will. If the plug-in traces it, it cannot be waited for before the plug-in has ended: both are
// then waited for as orphans (Children.h).
void TPlugInProcess::EndSupervisor() {
  if (fSupervisor <= 0) return;
  ::kill(fSupervisor, SIGKILL);
  int const options = fHasStoppedSupervisor ? WNOHANG : 0;
  while (::waitpid(fSupervisor, nullptr, options) < 0 && errno == EINTR) continue;
  fSupervisor = -1;
}

TPlugInFailure TPlugInProcess::WhyDead() const {
  std::string const stopped = "has stopped its supervisor process";
  if (fEnding == EEnding::kTimeUp)
    return Exceeded("time", "it exceeded the time limit of " + std::to_string(fLimits.fTimeoutSeconds) + " s" +
                                (fHasStoppedSupervisor ? ", and " + stopped : ""));
  if (fHasStoppedSupervisor) return {"it " + stopped};
  if (fEnding == EEnding::kTooLong)
    return Exceeded("size", "its result exceeds " + std::to_string(fLimits.fAnswerBytes) + " bytes");
  if (fEnding == EEnding::kBadAnswer) return {"its result is invalid: " + fAnswer.WhyBad()};
  if (fAnswer.Ending()) return *fAnswer.Ending();
  if (!fVerdict) return {"its supervisor process died"};
  if (fVerdict->fStartFailure != 0)
    return {"no process could be started for it: " + std::generic_category().message(fVerdict->fStartFailure)};
  if (fEnding == EEnding::kClosed && !fVerdict->fHadEndedByItself) return {"it closed the descriptor for its result"};
  return EndOf(fVerdict->fStatus);
}

}  // namespace NQRVZEP20
