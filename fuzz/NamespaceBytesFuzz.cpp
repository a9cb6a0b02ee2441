// SPDX-License-Identifier: Apache-2.0

// Reads any bytes as the answer of a plug-in's process. They must be refused, or make a namespace whose every operation returns
// or throws an exception, and which is the same when it is written and read again.

#include "TLogger.h"
#include "collect/answer/NamespaceBytes.h"
#include "collect/answer/TBadAnswer.h"
#include "collect/answer/TReceivedNamespace.h"
#include "fuzz/Require.h"
#include "tests/collect/answer/DumpOf.h"

#include <cstdint>
#include <string>

using namespace NQRVZEP20;

namespace {

std::string BytesOf(ICIMNamespace const& ns) {
  std::string bytes;
  WriteNamespace(ns, [&bytes](std::string_view piece) { bytes.append(piece); });
  return bytes;
}

// Some values read differently, such as a reference with a key that its class does not have: it throws.
void CheckReadAgain(ICIMNamespace const& ns) {
  std::string const written = BytesOf(ns);
  auto const again = TReceivedNamespace::From(written);
  Require(DumpOf(*again) == DumpOf(*TReceivedNamespace::From(BytesOf(*again))));
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(std::uint8_t const* data, std::size_t size) {
  TLogger::SetLogThreshold(static_cast<ILogger::EZEPLogSeverity>(-1));
  try {
    auto const ns = TReceivedNamespace::From(std::string(reinterpret_cast<char const*>(data), size));
    Require(!DumpOf(*ns).empty());
    CheckReadAgain(*ns);
  } catch (std::exception const&) {
    return 0;
  }
  return 0;
}
