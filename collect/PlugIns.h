// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "collect/Sample.h"
#include "collect/TNamespaceView.h"

#include <memory>
#include <optional>
#include <string>
#include <vector>

namespace NQRVZEP20 {

// One provider that a plug-in registered, after it was asked to fill its namespace.
struct TProviderRun {
  std::string fName;
  std::shared_ptr<TNamespaceView const> fView;  // null when the provider failed
  double fMilliseconds;                         // the time to fill the namespace
  std::string fError;                           // why the provider failed; empty when it succeeded
};

// One provider plug-in: a library lib*.nsp.so in the directory of libzepcore.so.
struct TPlugIn {
  std::string fName;     // "Host" for libHost.nsp.so
  std::string fFile;     // its path
  double fMilliseconds;  // the time to load the library
  std::string fError;    // why the library could not be loaded; empty when it was
  std::vector<TProviderRun> fProviders;

  bool HasFailed() const;  // the plug-in itself, or one of its providers
};

// Finds the provider plug-ins, loads each, and has its providers fill their namespaces, in the order of the names. With a sample,
// providers read that instead of this machine's tables (Sample.h).
//
// A plug-in that fails is returned with its error and stops no other. Throws TZEPException only when the directory of plug-ins
// cannot be read. Blocks until every provider has filled its namespace.
//
// Call it once per process, before other threads are started: plug-ins stay loaded and registered, so a second call finds no new
// providers. Plug-ins may print to standard output; a front end that writes a document there redirects it during this call.
std::vector<TPlugIn> LoadPlugIns(std::optional<TSample> const& sample = std::nullopt);

// The namespaces of all providers that did not fail. A view shares its namespace with the plug-in.
std::vector<TNamespaceView> ViewsOf(std::vector<TPlugIn> const& plugIns);

// "name: reason" for each plug-in and provider that failed.
std::vector<std::string> FailuresOf(std::vector<TPlugIn> const& plugIns);

// The directory that is searched for plug-ins.
std::string PlugInDirectory();

}  // namespace NQRVZEP20
