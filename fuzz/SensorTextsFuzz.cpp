// SPDX-License-Identifier: Apache-2.0

// Reads any text as the counters of the errors of a PCI Express device.

#include "fuzz/Require.h"
#include "providers/sensors/ErrorCounts.h"

extern "C" int LLVMFuzzerTestOneInput(std::uint8_t const* data, std::size_t size) {
  std::string const text(reinterpret_cast<char const*>(data), size);
  auto const counters = NQRVZEP20::AerCountersFrom(text);
  if (!counters)
    Require(!counters.Why().fReason.empty());
  else
    for (std::string const& kind : counters->fOccurred) Require(text.find(kind) != std::string::npos);
  return 0;
}
