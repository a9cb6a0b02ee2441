// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "collect/TNamespaceView.h"

#include <memory>
#include <string>
#include <vector>

namespace NQRVZEP20::zep {

// One provider of a plug-in, asked for its namespace.
struct TProviderRun {
  std::string fName;
  std::shared_ptr<TNamespaceView const> fView;  // empty when it failed
  double fMilliseconds;                         // that it took to fill the namespace
  std::string fError;                           // empty when it did not fail
};

// One provider library beside libzepcore.so, loaded.
struct TPlugIn {
  std::string fName;
  std::string fFile;
  double fMilliseconds;  // that it took to load
  std::string fError;    // why it could not be loaded; empty when it could
  std::vector<TProviderRun> fProviders;

  bool HasFailed() const;  // the plug-in itself, or one of its providers
};

// Finds the provider libraries, loads each and asks its providers for their namespaces, in the order of the names. A plug-in
// that fails stops no other.
std::vector<TPlugIn> LoadPlugIns();

// The namespaces of all providers that did not fail.
std::vector<TNamespaceView> ViewsOf(std::vector<TPlugIn> const& plugIns);

// "name: why" of each plug-in and provider that failed.
std::vector<std::string> FailuresOf(std::vector<TPlugIn> const& plugIns);

// The directory where plug-ins are looked for.
std::string PlugInDirectory();

}  // namespace NQRVZEP20::zep
