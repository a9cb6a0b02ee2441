// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "collect/PlugInFiles.h"
#include "collect/Sample.h"
#include "collect/TNamespaceView.h"

#include <cstdint>
#include <memory>
#include <optional>
#include <string>
#include <vector>

namespace NQRVZEP20 {

// The cost of reading the instances of one class, which the process of the plug-in measured.
struct TClassCost {
  std::string fClass;
  std::uint64_t fInstances = 0;  // of the class itself, without subclasses
  double fMilliseconds = 0;      // the time to enumerate the instances, and to read and serialise their values
  std::uint64_t fPeakBytes = 0;  // the highest growth of the memory meanwhile
};

// What happened to a plug-in or provider that failed, for programs. A part that does not apply is empty.
struct TCause {
  std::string fSignal = {};             // that killed its process: "SIGSEGV"
  std::optional<int> fExitStatus = {};  // of its process, if it exited
  std::string fException = {};          // the text of the exception that it threw
  std::string fLimit = {};              // that it exceeded (ApartLimits.h): "time", "memory" or "size"
};

// The result of one provider that a plug-in registered.
struct TProviderRun {
  std::string fName;
  std::shared_ptr<TNamespaceView const> fView;  // null when the provider failed before it had filled its namespace
  double fMilliseconds = 0;                     // the time to fill the namespace
  std::string fError;                           // why the provider failed; empty when it succeeded
  std::string fStage = {};                      // the stage that failed: "registration" or "fill"; otherwise empty
  std::string fLastLogLine = {};                // the last before the failure: "[Error] no disk"; empty if unknown
  TCause fCause = {};                           // of the failure
  std::uint64_t fPeakBytes = 0;                 // the highest growth of the memory during the fill; 0 if not measured
  std::vector<TClassCost> fCosts = {};          // in the order of the enumeration; empty if not measured
};

// The descriptors and processes that a plug-in had left when all its namespaces were filled.
struct TTraces {
  std::vector<std::string> fDescriptors;  // "5 (/etc/hostname)"
  std::vector<std::string> fProcesses;    // "1234 (sleep)"
};

// One provider plug-in: a library lib*.nsp.so in the directory of libzepcore.so, or one that is tried from elsewhere.
struct TPlugIn {
  std::string fName;         // "Host" for libHost.nsp.so
  std::string fFile;         // its path
  double fMilliseconds = 0;  // the time to load the library; 0 if it was not
  std::string fError;        // why the library could not be loaded; empty when it was
  std::vector<TProviderRun> fProviders;
  std::string fStage = {};              // the stage that failed: "open", "static construction" or "registration"; otherwise empty
  std::string fLastLogLine = {};        // the last before the failure; empty if unknown
  std::string fWords = {};              // its printed output, without the middle if it is long; empty if unknown
  TCause fCause = {};                   // of the failure
  std::uint64_t fPeakBytes = 0;         // the highest growth of the memory during the load; 0 if not measured
  std::optional<TTraces> fTraces = {};  // none if not measured, or if the process ended too early

  std::vector<std::string> fUndefinedSymbols = {};  // because of which it could not be loaded, as the linker names them

  bool fLogsDebug = false;                 // whether it has set the log threshold so that debug entries are logged
  EPlugInRule fRule = EPlugInRule::kNone;  // by which its file was passed over

  bool HasFailed() const;  // the plug-in itself or one of its providers
};

// Loads these provider plug-ins into this process, in this order, and calls the providers of each to fill their namespaces. With
// a sample, providers read the sample instead of this machine's tables (Sample.h). A file that is passed over is not in the
// result, unless it was meant to be a plug-in (PlugInFiles.h): then it has failed.
//
// A plug-in that fails is returned with its error and does not affect the others. But a plug-in that crashes, hangs or exits
// takes this process with it; LoadPlugInsApart (PlugInsApart.h) runs each plug-in in a separate process. Blocks until every
// provider has filled its namespace.
//
// Call it once per process, before other threads are started: plug-ins stay loaded and registered, so a second call finds no
// new providers. Plug-ins may print to standard output; a front end that writes a document there should redirect it during this
// call.
std::vector<TPlugIn> LoadPlugIns(std::vector<TPlugInFile> const& files, std::optional<TSample> const& sample = std::nullopt);

// The same for the plug-ins that FindPlugIns finds. Throws TZEPException only if the plug-in directory cannot be read.
std::vector<TPlugIn> LoadPlugIns(std::optional<TSample> const& sample = std::nullopt);

// The namespaces of all providers that filled them, even if some of the values cannot be read. A view shares ownership of its
// namespace with the plug-in.
std::vector<TNamespaceView> ViewsOf(std::vector<TPlugIn> const& plugIns);

// Why the plug-in, or one of its providers, failed: "no disk (fill, libTest.nsp.so); last log line: [Error] no disk".
std::string FailurePhraseOf(TPlugIn const& plugIn);
std::string FailurePhraseOf(TPlugIn const& plugIn, TProviderRun const& run);

// "name: phrase" for each plug-in and provider that failed.
std::vector<std::string> FailuresOf(std::vector<TPlugIn> const& plugIns);

// The result for a file that was meant to be a plug-in but is passed over.
TPlugIn PassedOver(TPlugInFile const& file);

}  // namespace NQRVZEP20
