// SPDX-License-Identifier: Apache-2.0
#include "collect/PlugInsApart.h"

#include "TRootObject.h"
#include "collect/process/Children.h"
#include "collect/process/LogLines.h"
#include "collect/process/TPlugInProcess.h"

#include <poll.h>
#include <sched.h>

#include <algorithm>
#include <map>
#include <memory>
#include <system_error>
#include <thread>

namespace NQRVZEP20 {

namespace {

using TClock = TPlugInProcess::TClock;
constexpr std::chrono::milliseconds kShowEvery(100);
constexpr std::chrono::milliseconds kLongestWait(200);  // so that a stop of this process is noticed soon

// The number of processors that this process may use.
std::size_t Processors() {
  cpu_set_t usable;
  bool const isKnown = ::sched_getaffinity(0, sizeof usable, &usable) == 0;  // not on a machine with more than 1024
  return isKnown ? static_cast<std::size_t>(CPU_COUNT(&usable)) : std::max(1u, std::thread::hardware_concurrency());
}

// The processes of all plug-ins, in the order of the plug-ins.
class TPool {
public:
  TPool(std::vector<TPlugInFile> files, std::string const& sampleLabel, TApartOptions const& options)
      : fFiles(std::move(files)),
        fSampleLabel(sampleLabel),
        fOptions(options),
        fParallel(options.fParallel != 0 ? options.fParallel : Processors()),
        fResults(fFiles.size()),
        fLogs(fFiles.size()) {}

  std::vector<TPlugIn> Run() {
    for (StartMore(); !fRunning.empty(); StartMore()) {
      Wait();
      Follow();
      ShowProgress();
    }
    if (fOptions.fShowProgress) fOptions.fShowProgress({});
    for (std::string const& log : fLogs) LogAgain(log);
    return std::move(fResults);
  }

private:
  struct TRunning {
    std::size_t fNumber;
    std::unique_ptr<TPlugInProcess> fProcess;
  };

  void StartMore() {
    for (; fNext < fFiles.size() && fRunning.size() < fParallel; ++fNext) {
      TPlugInFile const& file = fFiles[fNext];
      if (!file.IsLoaded()) {
        fResults[fNext] = PassedOver(file);
        continue;
      }
      try {
        fRunning.push_back({fNext, std::make_unique<TPlugInProcess>(file.fName, file.fFile, fOptions.fLimits, fSampleLabel,
                                                                    fOptions.fMeasures)});
      } catch (std::system_error const& failure) {
        if (!fRunning.empty()) return;  // it may be possible when another one has ended
        fResults[fNext] = {file.fName, file.fFile, 0, failure.what(), {}, NameOf(EStage::kOpen)};
      }
    }
  }

  void Wait() {
    std::vector<pollfd> polled;
    TClock::time_point next = TClock::time_point::max();
    for (TRunning const& running : fRunning) {
      running.fProcess->AddTo(polled);
      next = std::min(next, running.fProcess->NextDeadline());
    }
    auto wait = std::chrono::ceil<std::chrono::milliseconds>(next - TClock::now());
    wait = std::clamp(wait, std::chrono::milliseconds(0), fOptions.fShowProgress ? kShowEvery : kLongestWait);
    TClock::time_point const begin = TClock::now();
    ::poll(polled.data(), polled.size(), static_cast<int>(wait.count()));
    TClock::duration const longer = TClock::now() - begin - wait;
    if (longer.count() > 0) Grant(longer);  // this process was stopped
  }

  // A plug-in is not to blame for the time in which this process did not read from it.
  void Grant(TClock::duration time, TPlugInProcess const* except = nullptr) const {
    for (TRunning const& running : fRunning)
      if (running.fProcess.get() != except) running.fProcess->Grant(time);
  }

  void Follow() {
    for (TRunning const& running : fRunning) {
      TClock::time_point const begin = TClock::now();
      running.fProcess->Follow();
      Grant(TClock::now() - begin, running.fProcess.get());
    }
    TakeEnded();
  }

  void TakeEnded() {
    auto const ended = std::stable_partition(fRunning.begin(), fRunning.end(),
                                             [](TRunning const& running) { return !running.fProcess->HasEnded(); });
    bool hasOrphans = false;
    for (auto at = ended; at != fRunning.end(); ++at) {
      hasOrphans = hasOrphans || at->fProcess->HasLostSupervisor();
      fResults[at->fNumber] = at->fProcess->Result();
      fLogs[at->fNumber] = at->fProcess->Log();
    }
    fRunning.erase(ended, fRunning.end());
    if (hasOrphans) EndOrphans();
  }

  void EndOrphans() const {
    std::vector<pid_t> supervisors;
    for (TRunning const& running : fRunning) supervisors.push_back(running.fProcess->Supervisor());
    TClock::time_point const begin = TClock::now();
    fOrphans.End(supervisors);
    Grant(TClock::now() - begin);
  }

  void ShowProgress() {
    if (!fOptions.fShowProgress || TClock::now() < fLastShown + kShowEvery) return;
    fLastShown = TClock::now();
    std::vector<TPlugInAtWork> atWork;
    for (TRunning const& running : fRunning)
      atWork.push_back({running.fProcess->Name(), running.fProcess->Stage(), running.fProcess->SecondsInStage()});
    fOptions.fShowProgress(atWork);
    Grant(TClock::now() - fLastShown);
  }

  static void LogAgain(std::string const& log) {
    for (TLogLine const& line : LogLinesOf(log)) TRootObject::GetCoreLogger()->OutputLogEntry(line.fSeverity, line.fMessage);
  }

  std::vector<TPlugInFile> const fFiles;
  std::string const fSampleLabel;
  TApartOptions const& fOptions;
  std::size_t const fParallel;
  std::size_t fNext = 0;
  TOrphans const fOrphans;  // outlives the processes
  std::vector<TRunning> fRunning;
  std::vector<TPlugIn> fResults;
  std::vector<std::string> fLogs;
  TClock::time_point fLastShown = TClock::now();
};

std::string FileNameOf(TPlugIn const& plugIn) { return plugIn.fFile.substr(plugIn.fFile.rfind('/') + 1); }

// ---- Names that more than one plug-in registers ----

struct TClaim {
  TPlugIn const* fPlugIn;
  TProviderRun* fRun;
};

// The name of the claim's file, or its path if the file of the other claim has the same name.
std::string FileOf(TClaim const& claim, TClaim const& other) {
  std::string const name = FileNameOf(*claim.fPlugIn);
  return name == FileNameOf(*other.fPlugIn) ? claim.fPlugIn->fFile : name;
}

std::string TakenBy(TClaim const& claim, TClaim const& other) {
  return "the name " + claim.fRun->fName + " is already registered by " + FileOf(claim, other);
}

// The name belongs to the first plug-in whose provider has not failed. The rows of the others name it, and so does the row of the
// first plug-in, if its provider has failed.
void Settle(std::vector<TClaim> const& claims) {
  TClaim const& first = claims.front();
  auto const hasView = [](TClaim const& claim) { return claim.fRun->fView != nullptr; };
  auto const owner = std::find_if(claims.begin(), claims.end(), hasView);
  for (TClaim const& claim : claims) {
    TProviderRun& run = *claim.fRun;
    if (claim.fPlugIn == first.fPlugIn) continue;
    if (!hasView(claim)) {
      run.fError += "; " + TakenBy(first, claim);
    } else if (claim.fPlugIn != owner->fPlugIn) {
      run.fView.reset();
      run.fError = TakenBy(*owner, claim);
      run.fStage = NameOf(EStage::kRegistration);
    }
  }
  auto const second =
      std::find_if(claims.begin(), claims.end(), [&](TClaim const& claim) { return claim.fPlugIn != first.fPlugIn; });
  if (second == claims.end() || hasView(first)) return;
  bool const isOwner = owner != claims.end() && owner->fPlugIn != first.fPlugIn;
  TClaim const& other = isOwner ? *owner : *second;
  first.fRun->fError += "; the name " + first.fRun->fName + " is then registered by " + FileOf(other, first) +
                        (isOwner ? ", which is used instead" : "");
}

void SettleNames(std::vector<TPlugIn>& plugIns) {
  std::map<std::string, std::vector<TClaim>> claims;  // in the order of the plug-ins, by the names of providers
  for (TPlugIn& plugIn : plugIns)
    for (TProviderRun& run : plugIn.fProviders) claims[run.fName].push_back({&plugIn, &run});
  for (auto const& [name, ofName] : claims) Settle(ofName);
}

}  // namespace

std::vector<TPlugIn> LoadPlugInsApart(std::vector<TPlugInFile> files, std::optional<TSample> const& sample,
                                      TApartOptions const& options) {
  if (sample) SetForProviders(*sample);
  auto const isOfNoInterest = [](TPlugInFile const& file) { return !file.IsLoaded() && !file.fIsMeant; };
  files.erase(std::remove_if(files.begin(), files.end(), isOfNoInterest), files.end());
  std::vector<TPlugIn> plugIns = TPool(std::move(files), sample ? sample->fLabel : "", options).Run();
  SettleNames(plugIns);
  return plugIns;
}

std::vector<TPlugIn> LoadPlugInsApart(std::optional<TSample> const& sample, TApartOptions const& options) {
  return LoadPlugInsApart(FindPlugIns(), sample, options);
}

}  // namespace NQRVZEP20
