#pragma once

namespace NQRVZEP20::zep {

// What zep ends with.
enum EExitStatus {
  kExitComplete = 0,  // everything that was asked for
  kExitNothing = 1,   // nothing of it
  kExitPartial = 2,   // some of it; the output says what is missing, and why
  kExitUsage = 64     // zep was called in a way that it does not know
};

}  // namespace NQRVZEP20::zep
