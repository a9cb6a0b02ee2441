// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "collect/ApartLimits.h"
#include "collect/PlugIns.h"
#include "collect/answer/AnswerLimits.h"
#include "collect/answer/TNamespaceReader.h"
#include "collect/process/EStage.h"
#include "collect/process/Messages.h"

#include <chrono>
#include <functional>
#include <optional>
#include <string>
#include <string_view>

namespace NQRVZEP20 {

// How a plug-in, or the filling of a namespace, has failed.
struct TPlugInFailure {
  std::string fWhy;
  TCause fCause = {};
};

// The answer of a plug-in: the messages of its process (Messages.h) become its result. They may be any bytes: the first one that
// is wrong, or exceeds a limit (AnswerLimits.h), ends the answer, and what was complete before remains.
class TPlugInAnswer {
public:
  using TClock = std::chrono::steady_clock;
  enum class EState { kOpen, kDone, kTooLong, kBad };

  // `lastLogLine` returns the last line that the plug-in has logged; it is called when something has failed.
  TPlugInAnswer(std::string const& name, std::string const& file, TApartLimits const& limits, std::string sampleLabel,
                std::function<std::string()> lastLogLine);

  void Add(std::string_view bytes);  // drops them when the state is not kOpen

  EState State() const { return fState; }
  std::string const& WhyBad() const { return fWhyBad; }
  bool HasLoaded() const { return fHasLoaded; }
  EStage Stage() const { return fStage; }
  TClock::time_point StageBegan() const { return fStageBegan; }

  // How the plug-in announced the end of its process: an exception or the status that it passed to exit.
  std::optional<TPlugInFailure> const& Ending() const { return fEnding; }

  // The failure of the provider that is filling its namespace, or else of the plug-in, of which the first one counts. A long text
  // is cut.
  void Fail(TPlugInFailure failure);

  // Ends the answer. Providers whose namespace was not filled have failed.
  TPlugIn Finish(std::string words);

private:
  void Take(TMessage const& message);
  void TakeName(TMessage const& message);
  void TakeLoaded(std::string const& microseconds);
  void TakeClasses();
  void TakeExit(std::string const& status);
  void TakeNamespace(std::string const& microseconds);
  void NoteUnread(TProviderRun& run);
  void TakeCost(std::string const& bytes);
  void TakeTrace(TMessage const& message);
  void TakeUndefined(std::string const& symbol);
  void EndFill();
  void Begin(EStage stage);
  void Refuse(std::string why);
  std::optional<double> MillisecondsIn(std::string const& microseconds);  // refuses what is not a number
  bool HasRoomForARun();                                                  // refuses one too many
  TProviderRun* AddRun(std::string const& name);                          // null when there is no room
  TProviderRun* CurrentRun();

  TApartLimits const fLimits;
  std::string const fSampleLabel;
  std::function<std::string()> const fLastLogLine;
  TPlugIn fResult;
  EState fState = EState::kOpen;
  std::string fWhyBad;  // of kBad

  TMessageReader fMessages;
  std::uint64_t fAnswerBytes = 0;  // of all namespaces
  std::uint64_t fOtherBytes = 0;   // of all other messages, and of the heads of all
  TAnswerCounts fCounts;
  std::optional<TNamespaceReader> fNamespace;  // that is being filled
  std::uint64_t fCosts = 0;                    // the number of classes with a cost
  TTraces fTraces;                             // of the result when they are complete

  EStage fStage = EStage::kOpen;
  TClock::time_point fStageBegan = TClock::now();
  std::optional<std::string> fProvider;  // that is filling its namespace
  bool fHasLoaded = false;
  std::optional<TPlugInFailure> fEnding;
};

}  // namespace NQRVZEP20
