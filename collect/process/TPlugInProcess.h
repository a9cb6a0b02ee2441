// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "collect/ApartLimits.h"
#include "collect/PlugIns.h"
#include "collect/process/Descriptors.h"
#include "collect/process/EStage.h"
#include "collect/process/Supervisor.h"
#include "collect/process/TPlugInAnswer.h"
#include "collect/process/TWords.h"

#include <poll.h>
#include <sys/types.h>
#include <unistd.h>

#include <chrono>
#include <optional>
#include <string>
#include <vector>

namespace NQRVZEP20 {

// The owner's handle for the process of one plug-in and its supervisor. The owner polls the descriptors and calls Follow. If
// the process is still running when the handle is destroyed, it is killed; a copy of the handle in a forked process does not kill
// it. The calling process must be single-threaded.
class TPlugInProcess {
public:
  using TClock = TPlugInAnswer::TClock;

  // Starts the process, which also measures (TApartOptions) if `measures` is true. If a pipe or process cannot be created, throws
  // std::system_error and leaks nothing.
  TPlugInProcess(std::string const& name, std::string const& file, TApartLimits const& limits, std::string sampleLabel,
                 bool measures);
  ~TPlugInProcess();
  TPlugInProcess(TPlugInProcess const&) = delete;
  TPlugInProcess& operator=(TPlugInProcess const&) = delete;

  void AddTo(std::vector<pollfd>& polled) const;  // adds the descriptors to wait for
  TClock::time_point NextDeadline() const;        // the latest time at which Follow must be called

  // Reads the available data, and kills the process if a time limit has expired. Does not block.
  void Follow();

  // Shifts the time limits: the owner was stopped, or busy, and did not read.
  void Grant(TClock::duration time);

  bool HasEnded() const { return fHasEnded; }  // if true, the result is complete
  TPlugIn const& Result() const { return fResult; }
  std::string const& Log() const { return fLog; }   // in the format of a log file
  pid_t Supervisor() const { return fSupervisor; }  // or -1

  // Whether it has ended without the word of its supervisor: then there may be orphans (Children.h).
  bool HasLostSupervisor() const { return fHasEnded && !fVerdict; }

  std::string const& Name() const { return fResult.fName; }
  std::string Stage() const { return NameOf(fAnswer.Stage()); }
  double SecondsInStage() const { return std::chrono::duration<double>(TClock::now() - fAnswer.StageBegan()).count(); }

private:
  enum class EEnding { kNone, kDone, kTimeUp, kTooLong, kBadAnswer, kClosed };

  void WaitUntil(TClock::time_point time);
  bool IsSupervisorStopped() const;

  void Start(TApartLimits const& limits, bool measures);
  void ReadAnswer();
  void ReadWords();
  void ReadLog();
  void ReadVerdict();
  void DrainAnswer();
  void StartFillTime();
  void End(EEnding ending);  // only the first call sets the reason
  void CheckDeadlines();
  void Complete();
  void EndSupervisor();
  TPlugInFailure WhyDead() const;

  TApartLimits const fLimits;
  TPlugIn fResult;  // only names until the end
  pid_t const fOwner = ::getpid();
  pid_t fSupervisor = -1;
  TUniqueFd fControl, fAnswerEnd, fWordsEnd, fLogEnd, fVerdictEnd;  // below 0 when closed

  TPlugInAnswer fAnswer;
  TWords fWords;
  std::string fLog;

  std::optional<TClock::time_point> fDeadline;  // of the load or the fill
  std::optional<TClock::time_point> fGiveUpAt;  // when the supervisor or the process is waited for no longer
  std::optional<TClock::time_point> fLookAt;    // from when on a supervisor that is stopped is noticed
  bool fIsInFillTime = false, fHasEnded = false, fHasStoppedSupervisor = false;
  EEnding fEnding = EEnding::kNone;
  std::optional<TVerdict> fVerdict;
};

}  // namespace NQRVZEP20
