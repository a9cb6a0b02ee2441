// SPDX-License-Identifier: Apache-2.0
#include "collect/process/TPlugInProcess.h"

#include "collect/FailureOf.h"
#include "collect/answer/TReceivedNamespace.h"
#include "collect/process/LogLines.h"
#include "collect/process/PlugInChild.h"
#include "collect/process/SignalText.h"

#include <signal.h>
#include <sys/wait.h>
#include <unistd.h>

#include <algorithm>
#include <array>
#include <cstdlib>
#include <cstring>
#include <system_error>

namespace NQRVZEP20 {

namespace {

constexpr std::size_t kMostWords = 4096;             // kept of either end
constexpr std::size_t kMostLog = 16u * 1024 * 1024;  // the last line is kept of a longer log, too
constexpr std::size_t kMostProviders = 10'000;
constexpr std::chrono::seconds kGrace(5);       // for a process whose pipe is closed to end by itself
constexpr std::chrono::seconds kTimeToEnd(10);  // for a supervisor to end everything

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
  std::fflush(nullptr);  // a child must not write what is still in the buffers
  pid_t const child = ::fork();
  if (child < 0) throw std::system_error(errno, std::generic_category(), "no process");
  return child;
}

}  // namespace

TPlugInProcess::TPlugInProcess(std::string const& name, std::string const& file, TApartLimits const& limits,
                               std::string sampleLabel)
    : fLimits(limits), fSampleLabel(std::move(sampleLabel)), fResult{name, file, 0, "", {}}, fWords(kMostWords) {
  Start(limits);
  fDeadline = TClock::now() + std::chrono::seconds(limits.fTimeoutSeconds);
}

TPlugInProcess::~TPlugInProcess() {
  fControl.reset();
  if (fSupervisor > 0)
    while (::waitpid(fSupervisor, nullptr, 0) < 0 && errno == EINTR) continue;
}

void TPlugInProcess::Start(TApartLimits const& limits) {
  TPipe control = OpenPipe(), answer = OpenPipe(), words = OpenPipe(), log = OpenPipe(), verdict = OpenPipe();
  TChildSetup const setup{fResult.fName,         fResult.fFile,       answer.fWriteEnd.get(),
                          words.fWriteEnd.get(), log.fWriteEnd.get(), limits.fMemoryMebibytes * 1024 * 1024};
  fSupervisor = ForkOrThrow();
  if (fSupervisor == 0) {
    control.fWriteEnd.reset();  // so that the end of the owner is seen
    Supervise({control.fReadEnd.get(), verdict.fWriteEnd.get()}, [&] { RunPlugIn(setup); });
  }
  fControl = std::move(control.fWriteEnd);
  fAnswer = std::move(answer.fReadEnd);
  fWordsEnd = std::move(words.fReadEnd);
  fLogEnd = std::move(log.fReadEnd);
  fVerdictEnd = std::move(verdict.fReadEnd);
}

void TPlugInProcess::AddTo(std::vector<pollfd>& polled) const {
  for (TUniqueFd const* const fd : {&fAnswer, &fWordsEnd, &fLogEnd, &fVerdictEnd})
    if (*fd) polled.push_back({fd->get(), POLLIN, 0});
}

TPlugInProcess::TClock::time_point TPlugInProcess::NextDeadline() const {
  if (fGiveUpAt) return *fGiveUpAt;
  return fDeadline.value_or(TClock::time_point::max());
}

// The verdict is sent when no process of the plug-in is left: what the pipes hold then is all that will come.
void TPlugInProcess::Follow() {
  bool const hasVerdict = [&] {
    ReadVerdict();
    return !fVerdictEnd;
  }();
  ReadAnswer();
  ReadWords();
  ReadLog();
  if (!hasVerdict) return CheckDeadlines();
  while (fAnswer && fEnding == EEnding::kNone) {
    TUniqueFd const& answer = fAnswer;
    pollfd waiting{answer.get(), POLLIN, 0};
    if (::poll(&waiting, 1, 0) <= 0) break;
    ReadAnswer();
  }
  Complete();
}

// ---- Reading ----

void TPlugInProcess::ReadAnswer() {
  ReadFrom(fAnswer, [&](std::string_view bytes) {
    if (fEnding != EEnding::kNone) return;  // dropped
    fMessages.Add(bytes);
    while (fEnding == EEnding::kNone) {
      auto const message = fMessages.Next();
      if (!message) break;
      Take(*message);
    }
    if (!fMessages.IsBad()) return;
    fWhyBad = "malformed message";
    End(EEnding::kBadAnswer);
  });
  if (!fAnswer && !fGiveUpAt) fGiveUpAt = TClock::now() + kGrace;
}

void TPlugInProcess::ReadWords() {
  ReadFrom(fWordsEnd, [&](std::string_view text) { fWords.Add(text); });
}

void TPlugInProcess::ReadLog() {
  ReadFrom(fLogEnd, [&](std::string_view text) {
    fLog.append(text);
    if (fLog.size() > kMostLog) fLog.erase(kMostLog / 2, fLog.size() - kMostLog);
  });
}

void TPlugInProcess::ReadVerdict() {
  ReadFrom(fVerdictEnd, [&](std::string_view bytes) {
    TVerdict verdict;
    if (bytes.size() != sizeof verdict) return;
    std::memcpy(&verdict, bytes.data(), sizeof verdict);
    fVerdict = verdict;
  });
}

void TPlugInProcess::Take(TMessage const& message) {
  switch (message.fKind) {
    case EMessage::kStage:
      return Begin(static_cast<EStage>(message.fText.empty() ? '\0' : message.fText[0]));
    case EMessage::kRegistered:
      RunOf(message.fText);
      return;
    case EMessage::kTaken:
      fResult.fProviders.push_back({message.fText, nullptr, 0,
                                    "the plug-in registers this name twice; the second registration is ignored",
                                    NameOf(EStage::kRegistration), ""});
      return;
    case EMessage::kLoaded:
      if (fHasLoaded) return;
      fResult.fMilliseconds = std::strtod(message.fText.c_str(), nullptr);
      fHasLoaded = true;
      fDeadline = TClock::now() + std::chrono::seconds(fLimits.fTimeoutSeconds);  // of the fill
      return;
    case EMessage::kFilling:
      fProvider = message.fText;
      fBytes.clear();
      return Begin(EStage::kFill);
    case EMessage::kBytes:
      if (fBytes.size() + message.fText.size() > fLimits.fAnswerBytes) return End(EEnding::kTooLong);
      fBytes += message.fText;
      return;
    case EMessage::kFilled:
      return TakeNamespace(message.fText);
    case EMessage::kFailed:
      return TakeFailure(message.fText);
    case EMessage::kFatal:
      fFatal = message.fText;
      return;
    case EMessage::kExits:
      fExitStatus = message.fText;
      return;
    case EMessage::kDone:
      return End(EEnding::kDone);
  }
}

void TPlugInProcess::TakeNamespace(std::string const& milliseconds) {
  TProviderRun* const run = CurrentRun();
  if (run == nullptr) return;
  run->fMilliseconds = std::strtod(milliseconds.c_str(), nullptr);
  std::string const failure = FailureOf([&] {
    auto const ns = TReceivedNamespace::From(std::move(fBytes));
    run->fView = std::make_shared<TNamespaceView>(run->fName, ns, fSampleLabel);
  });
  if (!failure.empty()) TakeFailure(failure);
  fBytes = std::string();
  fProvider.reset();
}

// The failure of the provider that is filling its namespace, or else of the plug-in, of which the first one counts. The lines
// that were logged before the failure have arrived.
void TPlugInProcess::TakeFailure(std::string why) {
  if (!fProvider && !fResult.fError.empty()) return;
  bool const isOutOfMemory = fLimits.fMemoryMebibytes != 0 && why.find("std::bad_alloc") != why.npos;
  if (isOutOfMemory) why += " (the memory limit is " + std::to_string(fLimits.fMemoryMebibytes) + " MiB)";
  ReadLog();
  if (TProviderRun* const run = CurrentRun()) {
    run->fError = why;
    run->fStage = NameOf(EStage::kFill);
    run->fLastLogLine = LastLogLineOf(fLog);
    fProvider.reset();
  } else {
    fResult.fError = why;
    fResult.fStage = NameOf(fStage);
    fResult.fLastLogLine = LastLogLineOf(fLog);
  }
}

void TPlugInProcess::Begin(EStage stage) {
  fStage = std::min(stage, EStage::kFill);
  fStageBegan = TClock::now();
}

TProviderRun& TPlugInProcess::RunOf(std::string const& name) {
  if (fResult.fProviders.size() > kMostProviders) return fResult.fProviders.back();
  auto const place = std::find_if(fResult.fProviders.begin(), fResult.fProviders.end(),
                                  [&](TProviderRun const& run) { return run.fName >= name && run.fError.empty(); });
  return *fResult.fProviders.insert(place, {name, nullptr, 0, ""});
}

TProviderRun* TPlugInProcess::CurrentRun() {
  if (!fProvider) return nullptr;
  for (TProviderRun& run : fResult.fProviders)
    if (run.fName == *fProvider && run.fError.empty() && !run.fView) return &run;
  return &RunOf(*fProvider);
}

// ---- Ending ----

void TPlugInProcess::End(EEnding ending) {
  if (fEnding != EEnding::kNone) return;
  fEnding = ending;
  fControl.reset();
  fGiveUpAt = TClock::now() + kTimeToEnd;
}

void TPlugInProcess::CheckDeadlines() {
  TClock::time_point const now = TClock::now();
  if (fEnding == EEnding::kNone) {
    if (fDeadline && now >= *fDeadline) return End(EEnding::kTimeUp);
    if (fGiveUpAt && now >= *fGiveUpAt) End(EEnding::kClosed);
  } else if (now >= *fGiveUpAt) {  // a process that waits for a device cannot be ended
    ::kill(fSupervisor, SIGKILL);
    Complete();
  }
}

void TPlugInProcess::Complete() {
  fAnswer.reset();
  ReadWords();
  ReadLog();
  if (fEnding != EEnding::kDone) TakeFailure(WhyDead());
  RecordUnfilled();
  fResult.fWords = fWords.Get();
  fHasEnded = true;
}

// Of the providers that came after the one that ended the process, and of those that were registered after the load.
void TPlugInProcess::RecordUnfilled() {
  for (TProviderRun& run : fResult.fProviders)
    if (!run.fView && run.fError.empty()) {
      run.fError = fEnding == EEnding::kDone ? "not filled, because it was registered after the plug-in had been loaded"
                                             : "not filled, because the plug-in process had ended";
      run.fStage = NameOf(EStage::kFill);
    }
}

std::string TPlugInProcess::WhyDead() const {
  std::string const limit = std::to_string(fLimits.fTimeoutSeconds) + " s";
  if (fEnding == EEnding::kTimeUp) return "it exceeded the time limit of " + limit;
  if (fEnding == EEnding::kTooLong) return "its result exceeds " + std::to_string(fLimits.fAnswerBytes) + " bytes";
  if (fEnding == EEnding::kBadAnswer) return "its result is invalid: " + fWhyBad;
  if (fFatal) return *fFatal;
  if (fExitStatus) return "it exited with status " + *fExitStatus;
  if (!fVerdict) return "its supervisor process died";
  if (fEnding == EEnding::kClosed && !fVerdict->fHadEndedByItself) return "it closed the descriptor for its result";
  if (WIFEXITED(fVerdict->fStatus)) return "it exited with status " + std::to_string(WEXITSTATUS(fVerdict->fStatus));
  return "it was killed by " + SignalText(WTERMSIG(fVerdict->fStatus));
}

}  // namespace NQRVZEP20
