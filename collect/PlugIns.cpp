// SPDX-License-Identifier: Apache-2.0
#include "collect/PlugIns.h"

#include "ILogger.h"
#include "INamespaceProvider.h"
#include "TOSSpecific.h"
#include "TRootObject.h"
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

// As FailureOf, and how long it took.
template <class TWork>
std::string TimedFailureOf(TWork work, double& milliseconds) {
  auto const start = std::chrono::steady_clock::now();
  std::string failure = FailureOf(work);
  milliseconds = std::chrono::duration<double, std::milli>(std::chrono::steady_clock::now() - start).count();
  return failure;
}

// The dynamic linker's reason, which the library writes to the log before it throws.
std::string LinkerReason(std::string const& plugIn, std::string const& otherwise) {
  std::string const start = "Couldn't load NSP: " + plugIn + " (";
  auto const& entries = TRootObject::GetCoreLogger()->GetLog();
  for (auto entry = entries.rbegin(); entry != entries.rend(); ++entry) {
    std::string const& message = entry->fMessage;
    if (message.compare(0, start.size(), start) == 0) return message.substr(start.size(), message.size() - start.size() - 1);
  }
  return otherwise;
}

// The last error that the log has behind the entries that it had before, in brackets; an exception alone does not tell where.
std::string ErrorLoggedSince(std::size_t entriesBefore) {
  auto const& entries = TRootObject::GetCoreLogger()->GetLog();
  std::string error;
  std::size_t at = 0;
  for (ILogger::TLogEntry const& entry : entries)
    if (at++ >= entriesBefore && entry.fSeverity == ILogger::kLogError) error = " (" + entry.fMessage + ")";
  return error;
}

TProviderRun Fill(std::string const& name, boost::shared_ptr<INamespaceProvider> provider, std::string const& sampleLabel) {
  TProviderRun run{name, {}, 0, ""};
  auto const fill = [&] {
    auto const ns = provider->GetNamespace(TCIMContext());
    if (!ns) throw std::runtime_error("it has no namespace");
    run.fView = std::make_shared<TNamespaceView>(name, ns, sampleLabel);
  };
  std::size_t const entries = TRootObject::GetCoreLogger()->GetLog().size();
  run.fError = TimedFailureOf(fill, run.fMilliseconds);
  if (!run.fError.empty()) run.fError += ErrorLoggedSince(entries);
  return run;
}

TPlugIn Load(std::string const& name, std::string const& sampleLabel) {
  TPlugIn plugIn{name, PlugInDirectory() + TOSSpecific::kFileSeparator + "lib" + name + kNSPExtension, 0, "", {}};
  TProviders const before = RegisteredProviders();
  plugIn.fError = TimedFailureOf([&] { TOSSpecific::LoadNSPLibrary(name); }, plugIn.fMilliseconds);
  if (!plugIn.fError.empty()) plugIn.fError = LinkerReason(name, plugIn.fError);

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
