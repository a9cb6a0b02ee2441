// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "collect/ECompleteness.h"

namespace NQRVZEP20::zep {

// What zep ends with, whatever the command. docs/formats.md has the table.
enum EExitStatus {
  kExitComplete = 0,  // everything that was asked for
  kExitNothing = 1,   // nothing of it
  kExitPartial = 2,   // some of it; the output says what is missing, and why
  kExitUsage = 64,    // zep was called in a way that it does not know

  // Of transfers only, which end with kExitNothing when the server refuses them or they break off:
  kExitNoInput = 66,       // the file to be sent cannot be read
  kExitNoConnection = 68,  // the host is unknown, or nobody answers there
  kExitNoLibrary = 69,     // there is no libcurl, or none that will do
  kExitNotWritten = 73,    // the local file is there already, or cannot be written
  kExitStalled = 75,       // nothing moved any more

  // In documents only: zep dies of the signal that interrupted it, which a shell shows as this number.
  kExitHangUp = 129,
  kExitInterrupt = 130,
  kExitTermination = 143
};

inline EExitStatus ExitStatusOf(ECompleteness completeness) {
  switch (completeness) {
    case ECompleteness::kComplete:
      return kExitComplete;
    case ECompleteness::kPartial:
      return kExitPartial;
    default:
      return kExitNothing;
  }
}

// For programs: what it says of what was asked for. Every failure is "nothing".
inline char const* NameOf(EExitStatus status) {
  switch (status) {
    case kExitComplete:
      return "complete";
    case kExitPartial:
      return "partial";
    default:
      return "nothing";
  }
}

}  // namespace NQRVZEP20::zep
