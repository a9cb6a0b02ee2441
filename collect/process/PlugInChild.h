// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <cstdint>
#include <string>

namespace NQRVZEP20 {

// The parameters of a plug-in process.
struct TChildSetup {
  std::string fName;           // of the plug-in
  std::string fFile;           // the plug-in's path
  int fAnswer;                 // the descriptor to which the messages (Messages.h) are written
  int fWords;                  // the descriptor for standard output and standard error
  int fLog;                    // the descriptor to which the log is written
  std::uint64_t fMemoryBytes;  // the memory that the process may use in addition; 0: no limit
  bool fMeasures;              // whether costs and traces are measured
};

// Loads the plug-in into this process, calls its providers to fill their namespaces, and sends the result. Then exits.
//
// Standard input is the null device, no other descriptors are open, the log goes to `fLog`, and no core dump is written.
// Handlers that were registered with atexit before this call do not run, even if the plug-in calls exit. An exception that
// nothing catches ends the process, and is sent as the reason.
[[noreturn]] void RunPlugIn(TChildSetup const& setup) noexcept;

}  // namespace NQRVZEP20
