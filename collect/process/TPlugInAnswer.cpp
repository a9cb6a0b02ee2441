// SPDX-License-Identifier: Apache-2.0
#include "collect/process/TPlugInAnswer.h"

#include "collect/FailureOf.h"
#include "collect/SafeText.h"
#include "collect/answer/TReceivedNamespace.h"
#include "collect/process/Costs.h"
#include "collect/process/TimedFailure.h"

#include <algorithm>
#include <charconv>

namespace NQRVZEP20 {

TPlugInAnswer::TPlugInAnswer(std::string const& name, std::string const& file, TApartLimits const& limits,
                             std::string sampleLabel, std::function<std::string()> lastLogLine)
    : fLimits(limits),
      fSampleLabel(std::move(sampleLabel)),
      fLastLogLine(std::move(lastLogLine)),
      fResult{name, file, 0, "", {}} {}

void TPlugInAnswer::Add(std::string_view bytes) {
  if (fState != EState::kOpen) return;
  fMessages.Add(bytes);
  while (fState == EState::kOpen) {
    auto const message = fMessages.Next();
    if (!message) break;
    Take(*message);
  }
  if (fMessages.IsBad()) Refuse("malformed message");
}

void TPlugInAnswer::Take(TMessage const& message) {
  std::string const& text = message.fText;
  fOtherBytes += kMessageHead + (message.fKind == EMessage::kBytes ? 0 : text.size());
  if (fOtherBytes > kMostOtherBytes) return Refuse("its messages exceed " + std::to_string(kMostOtherBytes) + " bytes");
  switch (message.fKind) {
    case EMessage::kStage:
      return Begin(static_cast<EStage>(text.empty() ? '\0' : text[0]));
    case EMessage::kRegistered:
    case EMessage::kTaken:
    case EMessage::kFilling:
      return TakeName(message);
    case EMessage::kLoaded:
      return TakeLoaded(text);
    case EMessage::kBytes:
      fAnswerBytes += text.size();
      if (fAnswerBytes > fLimits.fAnswerBytes)
        fState = EState::kTooLong;
      else if (fNamespace)
        fNamespace->Add(text);
      return;
    case EMessage::kClasses:
      return TakeClasses();
    case EMessage::kFilled:
      return TakeNamespace(text);
    case EMessage::kFailed:
      return Fail({text, fStage == EStage::kOpen ? TCause() : CauseOf(text)});
    case EMessage::kFatal:
      fEnding = {text, CauseOf(text)};
      return;
    case EMessage::kExits:
      return TakeExit(text);
    case EMessage::kCost:
      return TakeCost(text);
    case EMessage::kLeftOpen:
    case EMessage::kLeftRunning:
      return TakeTrace(message);
    case EMessage::kTraced:
      fResult.fTraces = fTraces;
      return;
    case EMessage::kLogsDebug:
      fResult.fLogsDebug = true;
      return;
    case EMessage::kUndefined:
      return TakeUndefined(text);
    case EMessage::kDone:
      if (fProvider) Fail({"its result ended before its namespace was complete"});
      fState = EState::kDone;
      return;
  }
}

void TPlugInAnswer::TakeName(TMessage const& message) {
  std::string const& name = message.fText;
  if (name.size() > kLongestName)
    return Refuse("the name of a provider has more than " + std::to_string(kLongestName) + " bytes");
  if (message.fKind == EMessage::kFilling) {
    fProvider = name;
    fNamespace.emplace(fCounts);
    return Begin(EStage::kFill);
  }
  if (message.fKind == EMessage::kRegistered)
    AddRun(name);
  else if (HasRoomForARun())
    fResult.fProviders.push_back({name, nullptr, 0, "the plug-in registers this name twice; the second registration is ignored",
                                  NameOf(EStage::kRegistration), ""});
}

void TPlugInAnswer::TakeLoaded(std::string const& microseconds) {
  if (fHasLoaded) return;
  fResult.fMilliseconds = MillisecondsIn(microseconds).value_or(0);
  fHasLoaded = true;
}

// While the plug-in serialises its instances.
void TPlugInAnswer::TakeClasses() {
  if (!fNamespace) return;
  std::string const failure = FailureOf([&] { fNamespace->ReadClasses(); });
  if (!failure.empty()) Fail({failure});
}

void TPlugInAnswer::TakeNamespace(std::string const& microseconds) {
  auto const milliseconds = MillisecondsIn(microseconds);
  TProviderRun* const run = milliseconds ? CurrentRun() : nullptr;
  if (run == nullptr) return;
  run->fMilliseconds = *milliseconds;
  std::string const failure =
      FailureOf([&] { run->fView = std::make_shared<TNamespaceView>(run->fName, fNamespace->Finish(), fSampleLabel); });
  if (!failure.empty())
    Fail({failure});
  else if (!fNamespace->FirstFailure().empty())
    NoteUnread(*run);
  EndFill();
}

// The rest of the namespace is used.
void TPlugInAnswer::NoteUnread(TProviderRun& run) {
  run.fError = Shortened("its answer is incomplete: " + fNamespace->FirstFailure(), kLongestFailure);
  run.fStage = NameOf(EStage::kFill);
  run.fLastLogLine = fLastLogLine();
}

// A cost without a class is that of the load or the fill that is under way.
void TPlugInAnswer::TakeCost(std::string const& bytes) {
  TProviderRun* const run = CurrentRun();
  TClassCost cost;
  std::string const failure = FailureOf([&] { cost = CostFrom(bytes); });
  if (!failure.empty()) return Refuse("a cost is invalid: " + failure);
  if (cost.fClass.empty()) {
    (run != nullptr ? run->fPeakBytes : fResult.fPeakBytes) = cost.fPeakBytes;
  } else if (++fCosts > kMostClasses) {
    Refuse("there are more than " + std::to_string(kMostClasses) + " classes with a cost");
  } else if (run != nullptr) {
    run->fCosts.push_back(std::move(cost));
  }
}

void TPlugInAnswer::TakeTrace(TMessage const& message) {
  auto& traces = message.fKind == EMessage::kLeftOpen ? fTraces.fDescriptors : fTraces.fProcesses;
  if (traces.size() >= kMostTraces) return Refuse("it names more than " + std::to_string(kMostTraces) + " traces of a kind");
  traces.push_back(Shortened(message.fText, kLongestFailure));
}

void TPlugInAnswer::TakeUndefined(std::string const& symbol) {
  if (fResult.fUndefinedSymbols.size() >= kMostUndefinedSymbols)
    return Refuse("it names more than " + std::to_string(kMostUndefinedSymbols) + " undefined symbols");
  fResult.fUndefinedSymbols.push_back(Shortened(symbol, kLongestName));
}

// The status of a process is the lowest byte of what the plug-in passed to exit.
void TPlugInAnswer::TakeExit(std::string const& status) {
  fEnding = {"it exited with status " + status};
  int number = 0;
  if (std::from_chars(status.data(), status.data() + status.size(), number).ec == std::errc())
    fEnding->fCause.fExitStatus = number & 0xff;
}

void TPlugInAnswer::Fail(TPlugInFailure failure) {
  if (!fProvider && !fResult.fError.empty()) return;
  auto& [why, cause] = failure;
  if (why.empty()) why = "it failed without a reason";
  bool const isOutOfMemory = fLimits.fMemoryMebibytes != 0 && why.find("std::bad_alloc") != why.npos;
  if (isOutOfMemory) cause.fLimit = "memory";
  if (isOutOfMemory) why += " (the memory limit is " + std::to_string(fLimits.fMemoryMebibytes) + " MiB)";
  TProviderRun* const run = CurrentRun();
  (run != nullptr ? run->fError : fResult.fError) = Shortened(why, kLongestFailure);
  (run != nullptr ? run->fStage : fResult.fStage) = NameOf(run != nullptr ? EStage::kFill : fStage);
  cause.fException = Shortened(cause.fException, kLongestFailure);
  (run != nullptr ? run->fCause : fResult.fCause) = std::move(cause);
  (run != nullptr ? run->fLastLogLine : fResult.fLastLogLine) = fLastLogLine();
  if (run != nullptr) EndFill();
}

void TPlugInAnswer::EndFill() {
  fProvider.reset();
  fNamespace.reset();
}

TPlugIn TPlugInAnswer::Finish(std::string words) {
  for (TProviderRun& run : fResult.fProviders)
    if (!run.fView && run.fError.empty()) {
      run.fError = fState == EState::kDone ? "not filled, because it was registered after the plug-in had been loaded"
                                           : "not filled, because the plug-in process had ended";
      run.fStage = NameOf(EStage::kFill);
    }
  fResult.fWords = std::move(words);
  return std::move(fResult);
}

void TPlugInAnswer::Begin(EStage stage) {
  fStage = std::min(stage, EStage::kFill);
  fStageBegan = TClock::now();
}

void TPlugInAnswer::Refuse(std::string why) {
  fState = EState::kBad;
  fWhyBad = std::move(why);
}

std::optional<double> TPlugInAnswer::MillisecondsIn(std::string const& microseconds) {
  std::uint64_t number = 0;
  char const* const end = microseconds.data() + microseconds.size();
  auto const [last, error] = std::from_chars(microseconds.data(), end, number);
  if (error == std::errc() && last == end) return static_cast<double>(number) / 1000;
  Refuse("a time is not a number");
  return std::nullopt;
}

bool TPlugInAnswer::HasRoomForARun() {
  if (fResult.fProviders.size() < kMostProviders) return true;
  Refuse("it registers more than " + std::to_string(kMostProviders) + " providers");
  return false;
}

// In the order of the names, in which the providers fill their namespaces.
TProviderRun* TPlugInAnswer::AddRun(std::string const& name) {
  if (!HasRoomForARun()) return nullptr;
  auto& runs = fResult.fProviders;
  auto const place =
      std::find_if(runs.begin(), runs.end(), [&](TProviderRun const& run) { return run.fName >= name && run.fError.empty(); });
  return &*runs.insert(place, {name, nullptr, 0, ""});
}

// The row of the provider that is filling its namespace, if one is.
TProviderRun* TPlugInAnswer::CurrentRun() {
  if (!fProvider) return nullptr;
  for (TProviderRun& run : fResult.fProviders)
    if (run.fName == *fProvider && run.fError.empty() && !run.fView) return &run;
  return AddRun(*fProvider);
}

}  // namespace NQRVZEP20
