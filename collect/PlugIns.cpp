// SPDX-License-Identifier: Apache-2.0
#include "collect/PlugIns.h"

#include "INamespaceProvider.h"
#include "TLogger.h"
#include "TRootObject.h"
#include "collect/process/EStage.h"
#include "collect/process/SharedObject.h"
#include "collect/process/TimedFailure.h"

#include <algorithm>
#include <map>
#include <stdexcept>

namespace NQRVZEP20 {

namespace {

using TProviders = std::map<std::string, boost::shared_ptr<INamespaceProvider>>;

TProviders RegisteredProviders() {
  TProviders providers;
  TRootObject::GetNamespaceProviderManager()->EnumerateNamespaceProviders([&](boost::shared_ptr<INamespaceProvider> provider) {
    providers[provider->GetName(TCIMContext())] = provider;
    return true;
  });
  return providers;
}

TProviderRun Fill(std::string const& name, boost::shared_ptr<INamespaceProvider> provider, std::string const& sampleLabel) {
  TProviderRun run{name, {}, 0, ""};
  TTimedFailure const failure = TimedFailureOf([&] {
    auto const ns = provider->GetNamespace(TCIMContext());
    if (!ns) throw std::runtime_error(kHasNoNamespace);
    run.fView = std::make_shared<TNamespaceView>(name, ns, sampleLabel);
  });
  run.fMilliseconds = failure.fMilliseconds;
  run.fError = failure.MessageAndReason();
  if (!run.fError.empty()) run.fStage = NameOf(EStage::kFill);
  if (!run.fError.empty()) run.fCause = CauseOf(run.fError);
  return run;
}

bool LogsDebug() { return TLogger::GetInstance()->GetLogThreshold() >= ILogger::kLogDebug; }

TPlugIn Load(TPlugInFile const& file, std::string const& sampleLabel) {
  TPlugIn plugIn{file.fName, file.fFile, 0, "", {}};
  TProviders const before = RegisteredProviders();
  bool const loggedDebug = LogsDebug();
  TTimedFailure const failure = TimedFailureOf([&] { LoadLibraryOf(file); });
  plugIn.fMilliseconds = failure.fMilliseconds;
  plugIn.fError = failure.ReasonOrMessage();
  if (!plugIn.fError.empty()) plugIn.fStage = NameOf(EStage::kOpen);
  plugIn.fUndefinedSymbols = UndefinedSymbols(plugIn.fError, file.fFile);

  for (auto const& [providerName, provider] : RegisteredProviders())
    if (before.count(providerName) == 0) plugIn.fProviders.push_back(Fill(providerName, provider, sampleLabel));
  plugIn.fLogsDebug = LogsDebug() && !loggedDebug;
  return plugIn;
}

// The linker's message names the first one.
std::string MessageOf(TPlugIn const& plugIn) {
  std::string text = plugIn.fError;
  for (std::size_t at = 1; at < plugIn.fUndefinedSymbols.size(); ++at) text += ", " + plugIn.fUndefinedSymbols[at];
  return text;
}

// "kZEPStatusAccessDenied (fill, libTest.nsp.so); last log line: [Error] no disk". A line that repeats the error is left out.
std::string Phrase(std::string const& file, std::string const& error, std::string const& stage, std::string const& lastLogLine) {
  std::string const place = (stage.empty() ? "" : stage + ", ") + file.substr(file.rfind('/') + 1);
  bool const isNew = !lastLogLine.empty() && lastLogLine.find(error) == lastLogLine.npos;
  return Demangled(error) + " (" + place + ")" + (isNew ? "; last log line: " + lastLogLine : "");
}

}  // namespace

bool TPlugIn::HasFailed() const {
  return !fError.empty() ||
         std::any_of(fProviders.begin(), fProviders.end(), [](TProviderRun const& run) { return !run.fError.empty(); });
}

std::vector<TPlugIn> LoadPlugIns(std::vector<TPlugInFile> const& files, std::optional<TSample> const& sample) {
  if (sample) SetForProviders(*sample);
  std::vector<TPlugIn> plugIns;
  for (TPlugInFile const& file : files) {
    if (file.IsLoaded()) plugIns.push_back(Load(file, sample ? sample->fLabel : ""));
    if (!file.IsLoaded() && file.fIsMeant) plugIns.push_back(PassedOver(file));
  }
  return plugIns;
}

std::vector<TPlugIn> LoadPlugIns(std::optional<TSample> const& sample) { return LoadPlugIns(FindPlugIns(), sample); }

TPlugIn PassedOver(TPlugInFile const& file) {
  TPlugIn plugIn{file.fName, file.fFile, 0, file.fReason, {}, NameOf(EStage::kOpen)};
  plugIn.fRule = file.fRule;
  return plugIn;
}

std::vector<TNamespaceView> ViewsOf(std::vector<TPlugIn> const& plugIns) {
  std::vector<TNamespaceView> views;
  for (TPlugIn const& plugIn : plugIns)
    for (TProviderRun const& provider : plugIn.fProviders)
      if (provider.fView) views.push_back(*provider.fView);
  return views;
}

std::vector<std::string> FailuresOf(std::vector<TPlugIn> const& plugIns) {
  std::vector<std::string> failures;
  for (TPlugIn const& plugIn : plugIns) {
    if (!plugIn.fError.empty()) failures.push_back(plugIn.fName + ": " + FailurePhraseOf(plugIn));
    for (TProviderRun const& run : plugIn.fProviders)
      if (!run.fError.empty()) failures.push_back(run.fName + ": " + FailurePhraseOf(plugIn, run));
  }
  return failures;
}

std::string FailurePhraseOf(TPlugIn const& plugIn) {
  return Phrase(plugIn.fFile, MessageOf(plugIn), plugIn.fStage, plugIn.fLastLogLine);
}

std::string FailurePhraseOf(TPlugIn const& plugIn, TProviderRun const& run) {
  return Phrase(plugIn.fFile, run.fError, run.fStage, run.fLastLogLine);
}

}  // namespace NQRVZEP20
