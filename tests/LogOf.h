// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "tests/Support.h"

namespace NQRVZEP20 {

// Runs the function on a new thread and returns its log entries: "[Debug] SpawnProcess: process ls".
template <class TFunction>
std::vector<std::string> LogOf(TFunction function) {
  std::vector<std::string> entries;
  OnNewThread([&] {
    TLogCapture const log;
    function();
    entries = log.Entries();
  });
  return entries;
}

}  // namespace NQRVZEP20
