// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "TZEPFailure.h"
#include "collect/FailureOf.h"
#include "collect/PlugIns.h"

#include <chrono>
#include <string>

namespace NQRVZEP20 {

// Failures of a plug-in that are not the text of an exception.
constexpr char kHasNoNamespace[] = "it has no namespace";
constexpr char kCalledTerminate[] = "it called std::terminate";

// The cause of such a failure, or of one whose text is that of an exception.
inline TCause CauseOf(std::string const& failure) {
  TCause cause;
  if (failure != kHasNoNamespace && failure != kCalledTerminate) cause.fException = failure;
  return cause;
}

// Why a piece of work failed. Both strings are empty if it succeeded; the reason is also empty if the exception has none.
struct TTimedFailure {
  std::string fMessage, fReason;
  double fMilliseconds = 0;

  // For loading a library, where the reason is the dynamic linker's message.
  std::string ReasonOrMessage() const { return fReason.empty() ? fMessage : fReason; }
  std::string MessageAndReason() const { return fReason.empty() ? fMessage : fMessage + " (" + fReason + ")"; }
};

// Runs the work as FailureOf does, and measures the time that it takes.
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
