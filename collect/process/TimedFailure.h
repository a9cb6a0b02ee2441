// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "TZEPFailure.h"
#include "collect/FailureOf.h"

#include <chrono>
#include <string>

namespace NQRVZEP20 {

// Why a piece of work failed: both texts are empty when it succeeded, and the reason also when the failure carries none.
struct TTimedFailure {
  std::string fMessage, fReason;
  double fMilliseconds = 0;

  // For the loading of a library: the reason is that of the dynamic linker.
  std::string ReasonOrMessage() const { return fReason.empty() ? fMessage : fReason; }
  std::string MessageAndReason() const { return fReason.empty() ? fMessage : fMessage + " (" + fReason + ")"; }
};

// Runs the work as FailureOf does, and measures how long it takes.
template <class TWork>
TTimedFailure TimedFailureOf(TWork work) {
  auto const start = std::chrono::steady_clock::now();
  TTimedFailure failure;
  failure.fMessage = FailureOf([&] {
    try {
      work();
    } catch (TZEPFailure const& thrown) {
      failure.fReason = thrown.Reason();
      throw;
    }
  });
  failure.fMilliseconds = std::chrono::duration<double, std::milli>(std::chrono::steady_clock::now() - start).count();
  return failure;
}

}  // namespace NQRVZEP20
