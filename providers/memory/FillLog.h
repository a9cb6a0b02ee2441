// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "TZEPException.h"

#include <string>

namespace NQRVZEP20 {

// Logs "X_Disk.Id refused: kZEPStatusTypeMismatch: -1 is outside the range of uint32, 0 to 4294967295" as an error and throws a
// TZEPFailure with the code of `cause` and that line as its reason. The last part is the reason of `cause` if it is a
// TZEPFailure. `member` is empty when the refusal concerns the class itself.
[[noreturn]] void ThrowRefusal(std::string const& className, std::string const& member, TZEPException const& cause);

// Runs one step of filling a namespace. A TZEPException that it throws becomes a refusal (ThrowRefusal).
template <class TStep>
auto NameRefusal(std::string const& className, std::string const& member, TStep const& step) {
  try {
    return step();
  } catch (TZEPException const& cause) {
    ThrowRefusal(className, member, cause);
  }
}

}  // namespace NQRVZEP20
