// SPDX-License-Identifier: Apache-2.0

// Reads any text as the records of the kernel's log.

#include "fuzz/Require.h"
#include "providers/sensors/KernelLog.h"

#include <algorithm>

extern "C" int LLVMFuzzerTestOneInput(std::uint8_t const* data, std::size_t size) {
  std::string_view const text(reinterpret_cast<char const*>(data), size);
  auto const log = NQRVZEP20::KernelLogFrom(text);
  auto const lines = static_cast<std::uint64_t>(std::count(text.begin(), text.end(), '\n')) + 1;
  Require(log.fIsWhole);
  Require(log.fRecords + log.fUnreadable <= lines);
  Require(log.fEvents.size() + log.fLeftOut <= log.fRecords);
  for (auto const& event : log.fEvents) {
    Require(event.fMessage.fFacility == 0);
    Require(event.fMessage.fText.size() <= size);
    Require(event.fSubject.empty() || event.fMessage.fText.find(event.fSubject) != std::string::npos ||
            event.fSubject.rfind("CPU ", 0) == 0);
  }
  return 0;
}
