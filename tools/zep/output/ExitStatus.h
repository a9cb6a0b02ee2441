// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "collect/ECompleteness.h"

namespace NQRVZEP20::zep {

// The exit statuses of all commands. docs/formats.md has the table.
enum EExitStatus {
  kExitComplete = 0,  // everything was done
  kExitNothing = 1,   // nothing was done
  kExitPartial = 2,   // part of it was done; the output states what is missing, and why
  kExitFindings = 3,  // everything was done, but zep report found a problem of the severity given by --fail-on, or a worse one
  kExitUsage = 64,    // wrong usage

  // For transfers, which end with kExitNothing if the server refuses them or they fail halfway:
  kExitNoInput = 66,       // the file to send cannot be read; also: a stored report is refused
  kExitNoConnection = 68,  // the host is unknown or does not answer
  kExitNoLibrary = 69,     // libcurl is missing or unsuitable; also: libzep-packing.so
  kExitNotWritten = 73,    // the local file exists already, or cannot be written; also: a page
  kExitStalled = 75,       // no data moved for too long

  // Only in documents: zep is killed by the signal that interrupted it, which a shell reports as this number.
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

// For programs: how much was done. Every failure is "nothing".
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
