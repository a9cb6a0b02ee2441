// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "collect/ApartLimits.h"
#include "collect/PlugIns.h"
#include "collect/process/Descriptors.h"
#include "collect/process/EStage.h"
#include "collect/process/Messages.h"
#include "collect/process/Supervisor.h"
#include "collect/process/TWords.h"

#include <poll.h>
#include <sys/types.h>

#include <chrono>
#include <optional>
#include <string>
#include <vector>

namespace NQRVZEP20 {

// The process of one plug-in, seen from its owner, with the supervisor between them. The owner polls its descriptors and calls
// Follow. A process that still works when its owner is destroyed is ended. The caller has a single thread.
class TPlugInProcess {
public:
  using TClock = std::chrono::steady_clock;

  // Starts it. Throws std::system_error, and leaves nothing open, when there is no pipe or no process.
  TPlugInProcess(std::string const& name, std::string const& file, TApartLimits const& limits, std::string sampleLabel);
  ~TPlugInProcess();
  TPlugInProcess(TPlugInProcess const&) = delete;
  TPlugInProcess& operator=(TPlugInProcess const&) = delete;

  void AddTo(std::vector<pollfd>& polled) const;  // the descriptors to wait for
  TClock::time_point NextDeadline() const;        // by which Follow must be called at the latest

  // Reads what has arrived, and ends the process at a time limit. Does not block.
  void Follow();

  bool HasEnded() const { return fHasEnded; }  // then the result is complete
  TPlugIn const& Result() const { return fResult; }
  std::string const& Log() const { return fLog; }  // as its log file has it

  std::string const& Name() const { return fResult.fName; }
  std::string Stage() const { return fProvider ? NameOf(EStage::kFill) : NameOf(fStage); }
  double SecondsInStage() const { return std::chrono::duration<double>(TClock::now() - fStageBegan).count(); }

private:
  enum class EEnding { kNone, kDone, kTimeUp, kTooLong, kBadAnswer, kClosed };

  void Start(TApartLimits const& limits);
  void ReadAnswer();
  void ReadWords();
  void ReadLog();
  void ReadVerdict();
  void Take(TMessage const& message);
  void TakeNamespace(std::string const& milliseconds);
  void TakeFailure(std::string why);
  void Begin(EStage stage);
  void End(EEnding ending);  // the first reason counts
  void CheckDeadlines();
  void Complete();
  void RecordUnfilled();
  std::string WhyDead() const;
  TProviderRun& RunOf(std::string const& name);
  TProviderRun* CurrentRun();

  TApartLimits const fLimits;
  std::string const fSampleLabel;
  TPlugIn fResult;
  pid_t fSupervisor = -1;
  TUniqueFd fControl, fAnswer, fWordsEnd, fLogEnd, fVerdictEnd;  // below 0 when closed

  TMessageReader fMessages;
  std::string fBytes;  // of the namespace that is being filled
  TWords fWords;
  std::string fLog;

  EStage fStage = EStage::kOpen;
  std::optional<std::string> fProvider;  // that is filling its namespace
  TClock::time_point fStageBegan = TClock::now();
  std::optional<TClock::time_point> fDeadline;  // of the load or the fill
  std::optional<TClock::time_point> fGiveUpAt;  // when the supervisor or the process is waited for no longer
  bool fHasLoaded = false, fHasEnded = false;
  EEnding fEnding = EEnding::kNone;
  std::string fWhyBad;                     // of kBadAnswer
  std::optional<std::string> fExitStatus;  // that the plug-in passed to exit
  std::optional<std::string> fFatal;       // an exception that ended the process
  std::optional<TVerdict> fVerdict;
};

}  // namespace NQRVZEP20
