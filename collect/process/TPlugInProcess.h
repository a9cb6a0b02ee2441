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

// The owner's handle for the process of one plug-in and its supervisor. The owner polls the descriptors and calls Follow. If
// the process is still running when the handle is destroyed, it is killed. The calling process must be single-threaded.
class TPlugInProcess {
public:
  using TClock = std::chrono::steady_clock;

  // Starts the process. If a pipe or process cannot be created, throws std::system_error and leaks nothing.
  TPlugInProcess(std::string const& name, std::string const& file, TApartLimits const& limits, std::string sampleLabel);
  ~TPlugInProcess();
  TPlugInProcess(TPlugInProcess const&) = delete;
  TPlugInProcess& operator=(TPlugInProcess const&) = delete;

  void AddTo(std::vector<pollfd>& polled) const;  // adds the descriptors to wait for
  TClock::time_point NextDeadline() const;        // the latest time at which Follow must be called

  // Reads the available data, and kills the process if a time limit has expired. Does not block.
  void Follow();

  bool HasEnded() const { return fHasEnded; }  // if true, the result is complete
  TPlugIn const& Result() const { return fResult; }
  std::string const& Log() const { return fLog; }  // in the format of a log file

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
  void End(EEnding ending);  // only the first call sets the reason
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
  TUniqueFd fControl, fAnswer, fWordsEnd, fLogEnd, fVerdictEnd;  // empty when closed

  TMessageReader fMessages;
  std::string fBytes;  // the serialised namespace received so far
  TWords fWords;
  std::string fLog;

  EStage fStage = EStage::kOpen;
  std::optional<std::string> fProvider;  // the provider that is filling its namespace
  TClock::time_point fStageBegan = TClock::now();
  std::optional<TClock::time_point> fDeadline;  // for loading or filling
  std::optional<TClock::time_point> fGiveUpAt;  // when to stop waiting for the supervisor or the process
  bool fHasLoaded = false, fHasEnded = false;
  EEnding fEnding = EEnding::kNone;
  std::string fWhyBad;                     // the reason for kBadAnswer
  std::optional<std::string> fExitStatus;  // passed to exit by the plug-in
  std::optional<std::string> fFatal;       // an exception that ended the process
  std::optional<TVerdict> fVerdict;
};

}  // namespace NQRVZEP20
