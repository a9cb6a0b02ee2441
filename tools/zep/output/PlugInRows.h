// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "collect/PlugIns.h"
#include "tools/zep/output/Json.h"

#include <string>
#include <vector>

namespace NQRVZEP20::zep {

// What became of a plug-in that was loaded, or should have been: "filled root/zep/host". Without secrets.
std::string ResultOf(TPlugIn const& plugIn);

// The time to load it and to fill its namespaces: "8.1 ms".
std::string TimeTextOf(TPlugIn const& plugIn);

// A plug-in and its providers, for a document.
TJson PlugInAsJson(TPlugIn const& plugIn);

// An array of those that failed, or of which a provider failed.
TJson FailedPlugInsAsJson(std::vector<TPlugIn> const& plugIns);

}  // namespace NQRVZEP20::zep
