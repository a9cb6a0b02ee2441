// SPDX-License-Identifier: Apache-2.0
#include "collect/PlugIns.h"

#include "INamespaceProvider.h"
#include "TOSSpecific.h"
#include "TRootObject.h"
#include "TZEPFailure.h"
#include "collect/FailureOf.h"

#include <algorithm>
#include <chrono>
#include <filesystem>
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

// Why a piece of work failed: both texts are empty when it succeeded, and the reason also when the failure carries none.
struct TTimedFailure {
  std::string fMessage, fReason;
};

// Runs the work as FailureOf does, and measures how long it takes.
template <class TWork>
TTimedFailure TimedFailureOf(TWork work, double& milliseconds) {
  auto const start = std::chrono::steady_clock::now();
  TTimedFailure failure;
  failure.fMessage = FailureOf([&] {
    try {
      work();
    } catch (TZEPFailure const& thrown) {
      failure.fReason = thrown.Reason();
      throw;
    }
  });
  milliseconds = std::chrono::duration<double, std::milli>(std::chrono::steady_clock::now() - start).count();
  return failure;
}

TProviderRun Fill(std::string const& name, boost::shared_ptr<INamespaceProvider> provider, std::string const& sampleLabel) {
  TProviderRun run{name, {}, 0, ""};
  auto const fill = [&] {
    auto const ns = provider->GetNamespace(TCIMContext());
    if (!ns) throw std::runtime_error("it has no namespace");
    run.fView = std::make_shared<TNamespaceView>(name, ns, sampleLabel);
  };
  TTimedFailure const failure = TimedFailureOf(fill, run.fMilliseconds);
  run.fError = failure.fReason.empty() ? failure.fMessage : failure.fMessage + " (" + failure.fReason + ")";
  return run;
}

TPlugIn Load(std::string const& name, std::string const& sampleLabel) {
  TPlugIn plugIn{name, PlugInDirectory() + TOSSpecific::kFileSeparator + "lib" + name + kNSPExtension, 0, "", {}};
  TProviders const before = RegisteredProviders();
  TTimedFailure const failure = TimedFailureOf([&] { TOSSpecific::LoadNSPLibrary(name); }, plugIn.fMilliseconds);
  plugIn.fError = failure.fReason.empty() ? failure.fMessage : failure.fReason;  // of the dynamic linker

  for (auto const& [providerName, provider] : RegisteredProviders())
    if (before.count(providerName) == 0) plugIn.fProviders.push_back(Fill(providerName, provider, sampleLabel));
  return plugIn;
}

}  // namespace

bool TPlugIn::HasFailed() const {
  return !fError.empty() ||
         std::any_of(fProviders.begin(), fProviders.end(), [](TProviderRun const& run) { return !run.fError.empty(); });
}

std::vector<TPlugIn> LoadPlugIns(std::optional<TSample> const& sample) {
  if (sample) SetForProviders(*sample);
  std::vector<std::string> names = TOSSpecific::FindNSPs();
  std::sort(names.begin(), names.end());
  std::vector<TPlugIn> plugIns;
  for (std::string const& name : names) plugIns.push_back(Load(name, sample ? sample->fLabel : ""));
  return plugIns;
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
  auto const add = [&failures](std::string const& name, std::string const& error) {
    if (!error.empty()) failures.push_back(name + ": " + error);
  };
  for (TPlugIn const& plugIn : plugIns) {
    add(plugIn.fName, plugIn.fError);
    for (TProviderRun const& provider : plugIn.fProviders) add(provider.fName, provider.fError);
  }
  return failures;
}

std::string PlugInDirectory() { return std::filesystem::path(TOSSpecific::GetZEPRootPath()).lexically_normal().string(); }

}  // namespace NQRVZEP20
