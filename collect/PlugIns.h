// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "collect/Sample.h"
#include "collect/TNamespaceView.h"

#include <memory>
#include <optional>
#include <string>
#include <vector>

namespace NQRVZEP20 {

// One provider that a plug-in registered, after the call that fills its namespace.
struct TProviderRun {
  std::string fName;
  std::shared_ptr<TNamespaceView const> fView;  // null when the provider failed
  double fMilliseconds;                         // the time to fill the namespace
  std::string fError;                           // why the provider failed; empty when it succeeded
  std::string fStage = {};                      // in which it failed: "registration" or "fill"; otherwise empty
  std::string fLastLogLine = {};                // before it failed: "[Error] no disk"; empty when it is not known
};

// One provider plug-in: a library lib*.nsp.so in the directory of libzepcore.so.
struct TPlugIn {
  std::string fName;     // "Host" for libHost.nsp.so
  std::string fFile;     // its path
  double fMilliseconds;  // the time to load the library
  std::string fError;    // why the library could not be loaded; empty when it was
  std::vector<TProviderRun> fProviders;
  std::string fStage = {};        // in which the load failed: "open", "static construction" or "registration"; otherwise empty
  std::string fLastLogLine = {};  // before it failed; empty when it is not known
  std::string fWords = {};        // that it printed; of a long text the beginning and the end. Empty when it is not known

  bool HasFailed() const;  // the plug-in itself, or one of its providers
};

// Finds the provider plug-ins, loads each into this process, and has its providers fill their namespaces, in the order of the
// names. With a sample, providers read that instead of this machine's tables (Sample.h).
//
// A plug-in that fails is returned with its error and stops no other, but one that crashes, hangs or ends the process does so to
// this process: LoadPlugInsApart (PlugInsApart.h) has a process for each. Throws TZEPException only when the directory of
// plug-ins cannot be read. Blocks until every provider has filled its namespace.
//
// Call it once per process, before other threads are started: plug-ins stay loaded and registered, so a second call finds no new
// providers. Plug-ins may print to standard output; a front end that writes a document there redirects it during this call.
std::vector<TPlugIn> LoadPlugIns(std::optional<TSample> const& sample = std::nullopt);

// The namespaces of all providers that did not fail. A view shares its namespace with the plug-in.
std::vector<TNamespaceView> ViewsOf(std::vector<TPlugIn> const& plugIns);

// Why the plug-in, or a provider of it, failed: "no disk (fill, libTest.nsp.so); last log line: [Error] no disk".
std::string FailurePhraseOf(TPlugIn const& plugIn);
std::string FailurePhraseOf(TPlugIn const& plugIn, TProviderRun const& run);

// "name: phrase" for each plug-in and provider that failed.
std::vector<std::string> FailuresOf(std::vector<TPlugIn> const& plugIns);

// The names of the plug-ins in the directory, sorted; and the path of one. Throws TZEPException when the directory cannot be
// read.
std::vector<std::string> PlugInNames();
std::string PlugInFile(std::string const& name);

// The directory that is searched for plug-ins.
std::string PlugInDirectory();

}  // namespace NQRVZEP20
