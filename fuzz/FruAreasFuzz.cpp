// SPDX-License-Identifier: Apache-2.0

// Reads any bytes as the content of a FRU device, whole and as far as needed.

#include "fuzz/Require.h"
#include "providers/controller/FruAreas.h"

#include <algorithm>
#include <string_view>

namespace NQRVZEP20 {
namespace {

// The part that is read from a device, whose needed length is known better with each part.
std::string_view NeededPartOf(std::string_view content) {
  std::string_view part;
  while (part.size() < std::min(content.size(), LengthOfAreas(part))) part = content.substr(0, LengthOfAreas(part));
  return part;
}

bool HaveSameTexts(std::vector<TFruArea> const& areas, std::vector<TFruArea> const& others) {
  auto const textOf = [](TFinding<std::string> const& text) { return text ? *text : text.Why().fReason; };
  return std::equal(areas.begin(), areas.end(), others.begin(), others.end(), [&](TFruArea const& area, TFruArea const& other) {
    return area.fKind == other.fKind && textOf(area.fName) == textOf(other.fName) && area.fCustom == other.fCustom &&
           textOf(area.fSerialNumber) == textOf(other.fSerialNumber);
  });
}

}  // namespace
}  // namespace NQRVZEP20

extern "C" int LLVMFuzzerTestOneInput(std::uint8_t const* data, std::size_t size) {
  using namespace NQRVZEP20;
  std::string_view const content(reinterpret_cast<char const*>(data), size);
  auto const areas = FruAreasFrom(content), ofNeeded = FruAreasFrom(NeededPartOf(content));
  Require(areas ? ofNeeded && HaveSameTexts(*areas, *ofNeeded) : !ofNeeded && !areas.Why().fReason.empty());
  if (!areas) return 0;
  Require(areas->size() <= 3);
  for (auto const& area : *areas) {
    Require(area.fSerialNumber ? !area.fSerialNumber->empty() : !area.fSerialNumber.Why().fReason.empty());
    for (std::string const& text : area.fCustom) Require(!text.empty() && text.size() <= 2 * 63);
  }
  return 0;
}
