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
  for (TProviderRun const& provider : plugIn.fProviders)
    providers.push_back({{"name", provider.fName},
                         {"namespace", provider.fView ? TJson(provider.fView->GetName()) : TJson(nullptr)},
                         {"milliseconds", provider.fMilliseconds},
                         {"error", OrNull(provider.fError)},
                         {"stage", OrNull(provider.fStage)},
                         {"lastLogLine", OrNull(provider.fLastLogLine)}});
  return {{"name", plugIn.fName},
          {"file", plugIn.fFile},
          {"milliseconds", plugIn.fMilliseconds},
          {"error", OrNull(plugIn.fError)},
          {"stage", OrNull(plugIn.fStage)},
          {"lastLogLine", OrNull(plugIn.fLastLogLine)},
          {"words", OrNull(plugIn.fWords)},
          {"undefinedSymbols", Readable(plugIn.fUndefinedSymbols)},
          {"providers", providers}};
}

TJson FailedPlugInsAsJson(std::vector<TPlugIn> const& plugIns) {
  TJson json = TJson::array();
  for (TPlugIn const& plugIn : plugIns)
    if (plugIn.HasFailed()) json.push_back(PlugInAsJson(plugIn));
  return json;
}

}  // namespace NQRVZEP20::zep
