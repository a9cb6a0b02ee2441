// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "TZEPException.h"

#include <string>

namespace NQRVZEP20 {

// Logs an error such as "X_Disk.Id refused: kZEPStatusTypeMismatch", because an exception does not contain the place. `member` is
// empty when the class itself was refused.
void LogRefusal(std::string const& className, std::string const& member, TZEPException const& reason);

// Runs one step of filling a namespace. When the step throws, the refused class and member are logged.
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
