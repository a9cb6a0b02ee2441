// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "collect/FailureOf.h"
#include "tools/zep/output/ExitStatus.h"

#include <exception>
#include <stdexcept>
#include <string>

namespace NQRVZEP20::zep {

// A failure that ends zep with the exit status `fStatus`. The message gives the cause and, if there is one, the remedy; it
// contains no password.
struct TFailure : std::runtime_error {
  TFailure(EExitStatus status, std::string const& why) : std::runtime_error(why), fStatus(status) {}

  EExitStatus fStatus;
};

// Wrong usage.
struct TWrongUsage : TFailure {
  explicit TWrongUsage(std::string const& why) : TFailure(kExitUsage, why) {}
};

// The exit status for an exception: that of a TFailure, kExitNothing for all others.
inline EExitStatus StatusOf(std::exception const& thrown) {
  auto const* const failure = dynamic_cast<TFailure const*>(&thrown);
  return failure != nullptr ? failure->fStatus : kExitNothing;
}

}  // namespace NQRVZEP20::zep
