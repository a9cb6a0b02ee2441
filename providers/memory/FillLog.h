// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "TZEPException.h"

#include <string>

namespace NQRVZEP20 {

// Logs "X_Disk.Id refused: kZEPStatusTypeMismatch" as an error: an exception alone does not tell where. `member` is empty
// when the refusal concerns the class as a whole.
void LogRefusal(std::string const& className, std::string const& member, TZEPException const& reason);

// Does one step of filling a namespace; when it throws, the log says what was refused.
template <class TStep>
auto NameRefusal(std::string const& className, std::string const& member, TStep const& step) {
  try {
    return step();
  } catch (TZEPException const& reason) {
    LogRefusal(className, member, reason);
    throw;
  }
}

}  // namespace NQRVZEP20
