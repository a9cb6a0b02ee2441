// SPDX-License-Identifier: Apache-2.0

// Reads any bytes as the content of a FRU device.

#include "fuzz/Require.h"
#include "providers/controller/FruAreas.h"

extern "C" int LLVMFuzzerTestOneInput(std::uint8_t const* data, std::size_t size) {
  auto const areas = NQRVZEP20::FruAreasFrom({reinterpret_cast<char const*>(data), size});
  if (!areas) {
    Require(!areas.Why().fReason.empty());
    return 0;
  }
  Require(areas->size() <= 3);
  for (auto const& area : *areas) {
    Require(area.fSerialNumber ? !area.fSerialNumber->empty() : !area.fSerialNumber.Why().fReason.empty());
    for (std::string const& text : area.fCustom) Require(!text.empty() && text.size() <= 2 * 63);
  }
  return 0;
}
