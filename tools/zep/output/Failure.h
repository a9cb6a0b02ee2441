// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "collect/FailureOf.h"
#include "tools/zep/output/ExitStatus.h"

#include <exception>
#include <stdexcept>
#include <string>

namespace NQRVZEP20::zep {

// Ends zep with that status. The text gives the cause and, where there is one, the remedy, and shows no password.
struct TFailure : std::runtime_error {
  TFailure(EExitStatus status, std::string const& why) : std::runtime_error(why), fStatus(status) {}

  EExitStatus fStatus;
};

// zep was called in a way that it does not know.
struct TWrongUsage : TFailure {
  explicit TWrongUsage(std::string const& why) : TFailure(kExitUsage, why) {}
};

// The exit status for what was thrown: a TFailure's own, kExitNothing for all else.
inline EExitStatus StatusOf(std::exception const& thrown) {
  auto const* const failure = dynamic_cast<TFailure const*>(&thrown);
  return failure != nullptr ? failure->fStatus : kExitNothing;
}

}  // namespace NQRVZEP20::zep
