// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <cstdint>
#include <string>

namespace NQRVZEP20 {

// What the process of a plug-in works with.
struct TChildSetup {
  std::string fName;           // of the plug-in, for TOSSpecific::LoadNSPLibrary
  std::string fFile;           // its path
  int fAnswer;                 // the descriptor that gets the messages (Messages.h)
  int fWords;                  // that becomes standard output and standard error
  int fLog;                    // that gets the lines of the log
  std::uint64_t fMemoryBytes;  // that the process may use in addition; 0: any number
};

// Loads the plug-in in this process, has its providers fill their namespaces, and sends everything. Ends the process.
//
// Standard input is the null device, no other descriptors are open, the log goes to `fLog`, and no core dump is written. Handlers
// that were registered with atexit before do not run, even when the plug-in calls exit.
[[noreturn]] void RunPlugIn(TChildSetup const& setup);

}  // namespace NQRVZEP20
