// SPDX-License-Identifier: Apache-2.0
#include "tools/zep/output/PlugInRows.h"

#include "collect/process/SharedObject.h"
#include "tools/zep/secrets/Secrets.h"

#include <cstdio>

namespace NQRVZEP20::zep {

namespace {

TJson Readable(std::vector<std::string> const& symbols) {
  TJson names = TJson::array();
  for (std::string const& symbol : symbols) names.push_back(Demangled(symbol));
  return names;
}

// Adds the members that are null unless the plug-in or provider has failed.
template <class TFailed>
void AddFailure(TJson& row, TFailed const& failed) {
  TCause const& cause = failed.fCause;
  row["error"] = OrNull(failed.fError);
  row["stage"] = OrNull(failed.fStage);
  row["signal"] = OrNull(cause.fSignal);
  row["exitStatus"] = cause.fExitStatus ? TJson(*cause.fExitStatus) : TJson(nullptr);
  row["exception"] = OrNull(cause.fException);
  row["limit"] = OrNull(cause.fLimit);
  row["lastLogLine"] = OrNull(failed.fLastLogLine);
}

}  // namespace

std::string ResultOf(TPlugIn const& plugIn) {
  if (!plugIn.fError.empty()) return "failed: " + MessageWithoutSecrets(FailurePhraseOf(plugIn));
  if (plugIn.fProviders.empty()) return "loaded, but registered no provider of its own";
  std::string text;
  for (TProviderRun const& provider : plugIn.fProviders) {
    if (!text.empty()) text += "; ";
    text += provider.fError.empty()
                ? "filled " + provider.fView->GetName()
                : "provider " + provider.fName + " failed: " + MessageWithoutSecrets(FailurePhraseOf(plugIn, provider));
  }
  return text;
}

std::string TimeTextOf(TPlugIn const& plugIn) {
  double milliseconds = plugIn.fMilliseconds;
  for (TProviderRun const& provider : plugIn.fProviders) milliseconds += provider.fMilliseconds;
  char text[32];
  std::snprintf(text, sizeof text, "%.1f ms", milliseconds);
  return text;
}

TJson PlugInAsJson(TPlugIn const& plugIn) {
  TJson providers = TJson::array();
  for (TProviderRun const& provider : plugIn.fProviders) {
    TJson const ns = provider.fView ? TJson(provider.fView->GetName()) : TJson(nullptr);
    TJson row = {{"name", provider.fName}, {"namespace", ns}, {"milliseconds", provider.fMilliseconds}};
    AddFailure(row, provider);
    providers.push_back(row);
  }
  TJson row = {{"name", plugIn.fName}, {"file", plugIn.fFile}, {"milliseconds", plugIn.fMilliseconds}};
  AddFailure(row, plugIn);
  row["undefinedSymbols"] = Readable(plugIn.fUndefinedSymbols);
  row["words"] = OrNull(plugIn.fWords);
  row["providers"] = providers;
  return row;
}

TJson FailedPlugInsAsJson(std::vector<TPlugIn> const& plugIns) {
  TJson json = TJson::array();
  for (TPlugIn const& plugIn : plugIns)
    if (plugIn.HasFailed()) json.push_back(PlugInAsJson(plugIn));
  return json;
}

}  // namespace NQRVZEP20::zep
