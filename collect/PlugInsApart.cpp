// SPDX-License-Identifier: Apache-2.0
#include "collect/PlugInsApart.h"

#include "TRootObject.h"
#include "collect/process/LogLines.h"
#include "collect/process/TPlugInProcess.h"

#include <poll.h>

#include <algorithm>
#include <map>
#include <memory>
#include <system_error>
#include <thread>

namespace NQRVZEP20 {

namespace {

using TClock = TPlugInProcess::TClock;
constexpr std::chrono::milliseconds kShowEvery(100);

// The processes of all plug-ins, in the order of the plug-ins.
class TPool {
public:
  TPool(std::vector<TPlugInFile> files, std::string const& sampleLabel, TApartOptions const& options)
      : fFiles(std::move(files)),
        fSampleLabel(sampleLabel),
        fOptions(options),
        fParallel(options.fParallel != 0 ? options.fParallel : std::max(1u, std::thread::hardware_concurrency())),
        fResults(fFiles.size()),
        fLogs(fFiles.size()) {}

  std::vector<TPlugIn> Run() {
    for (StartMore(); !fRunning.empty(); StartMore()) {
      Wait();
      Follow();
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
        fRunning.push_back({fNext, std::make_unique<TPlugInProcess>(file.fName, file.fFile, fOptions.fLimits, fSampleLabel)});
      } catch (std::system_error const& failure) {
        if (!fRunning.empty()) return;  // it may be possible when another one has ended
        fResults[fNext] = {file.fName, file.fFile, 0, failure.what(), {}, NameOf(EStage::kOpen)};
      }
    }
  }

  void Wait() const {
    std::vector<pollfd> polled;
    TClock::time_point next = TClock::time_point::max();
    for (TRunning const& running : fRunning) {
      running.fProcess->AddTo(polled);
      next = std::min(next, running.fProcess->NextDeadline());
    }
    auto wait = std::chrono::ceil<std::chrono::milliseconds>(next - TClock::now());
    if (fOptions.fShowProgress) wait = std::min(wait, kShowEvery);
    ::poll(polled.data(), polled.size(), static_cast<int>(std::clamp<long>(wait.count(), 0, 3600000)));
  }

  void Follow() {
    for (TRunning const& running : fRunning) running.fProcess->Follow();
    auto const ended = std::stable_partition(fRunning.begin(), fRunning.end(),
                                             [](TRunning const& running) { return !running.fProcess->HasEnded(); });
    for (auto at = ended; at != fRunning.end(); ++at) {
      fResults[at->fNumber] = at->fProcess->Result();
      fLogs[at->fNumber] = at->fProcess->Log();
    }
    fRunning.erase(ended, fRunning.end());
    ShowProgress();
  }

  void ShowProgress() {
    if (!fOptions.fShowProgress || TClock::now() < fLastShown + kShowEvery) return;
    fLastShown = TClock::now();
    std::vector<TPlugInAtWork> atWork;
    for (TRunning const& running : fRunning)
      atWork.push_back({running.fProcess->Name(), running.fProcess->Stage(), running.fProcess->SecondsInStage()});
    fOptions.fShowProgress(atWork);
  }

  static void LogAgain(std::string const& log) {
    for (TLogLine const& line : LogLinesOf(log)) TRootObject::GetCoreLogger()->OutputLogEntry(line.fSeverity, line.fMessage);
  }

  std::vector<TPlugInFile> const fFiles;
  std::string const fSampleLabel;
  TApartOptions const& fOptions;
  std::size_t const fParallel;
  std::size_t fNext = 0;
  std::vector<TRunning> fRunning;
  std::vector<TPlugIn> fResults;
  std::vector<std::string> fLogs;
  TClock::time_point fLastShown = TClock::now();
};

std::string FileNameOf(TPlugIn const& plugIn) { return plugIn.fFile.substr(plugIn.fFile.rfind('/') + 1); }

// If two plug-ins register the same name, the first one keeps it and the other one fails.
void RefuseTakenNames(std::vector<TPlugIn>& plugIns) {
  std::map<std::string, std::string> owners;  // the files of the plug-ins, by the names of providers
  for (TPlugIn& plugIn : plugIns)
    for (TProviderRun& run : plugIn.fProviders) {
      auto const [owner, isNew] = owners.emplace(run.fName, FileNameOf(plugIn));
      if (isNew || owner->second == FileNameOf(plugIn)) continue;
      run.fView.reset();
      run.fError = "the name " + run.fName + " is already registered by " + owner->second;
      run.fStage = NameOf(EStage::kRegistration);
    }
}

}  // namespace

std::vector<TPlugIn> LoadPlugInsApart(std::vector<TPlugInFile> files, std::optional<TSample> const& sample,
                                      TApartOptions const& options) {
  if (sample) SetForProviders(*sample);
  auto const isOfNoInterest = [](TPlugInFile const& file) { return !file.IsLoaded() && !file.fIsMeant; };
  files.erase(std::remove_if(files.begin(), files.end(), isOfNoInterest), files.end());
  std::vector<TPlugIn> plugIns = TPool(std::move(files), sample ? sample->fLabel : "", options).Run();
  RefuseTakenNames(plugIns);
  return plugIns;
}

std::vector<TPlugIn> LoadPlugInsApart(std::optional<TSample> const& sample, TApartOptions const& options) {
  return LoadPlugInsApart(FindPlugIns(), sample, options);
}

}  // namespace NQRVZEP20
