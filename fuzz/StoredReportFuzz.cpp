// SPDX-License-Identifier: Apache-2.0

// Reads any bytes as a stored report. A text that is refused has a reason with the name of the file; one that is accepted, cut by
// one byte, is refused.

#include "collect/stored/StoredReport.h"
#include "fuzz/Require.h"

#include <cstdint>
#include <string>

using namespace NQRVZEP20;

namespace {

bool IsAccepted(std::string const& text) {
  try {
    TStoredReport const report = StoredReportFrom(text, "a.json");
    for (TStoredInstance const& instance : report.fInstances)
      for (TStoredProperty const& property : instance.fProperties) Require(property.IsKnown() || property.fText.empty());
    return true;
  } catch (TStoredReportError const& failure) {
    Require(std::string(failure.what()).rfind("a.json: ", 0) == 0);
    return false;
  }
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(std::uint8_t const* data, std::size_t size) {
  std::string const text(reinterpret_cast<char const*>(data), size);
  if (IsAccepted(text) && text.back() == '}') Require(!IsAccepted(text.substr(0, size - 1)));
  return 0;
}
