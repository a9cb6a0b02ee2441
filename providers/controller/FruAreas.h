// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "providers/reasons/TFinding.h"

#include <cstddef>
#include <cstdint>
#include <string>
#include <string_view>
#include <vector>

namespace NQRVZEP20 {

// One information area of a FRU device (field replaceable unit): what the maker wrote about a chassis, a board or a product.
struct TFruArea {
  enum class EKind { kChassis, kBoard, kProduct, kUnread };  // kUnread: the device was not read
  using TText = TFinding<std::string>;

  EKind fKind = EKind::kChassis;
  TFinding<std::uint64_t> fManufactureTime = TMissing{};  // of a board, in seconds since 1970
  TText fManufacturer = TMissing{}, fName = TMissing{}, fPartNumber = TMissing{}, fVersion = TMissing{},
        fSerialNumber = TMissing{}, fAssetTag = TMissing{}, fFileId = TMissing{};
  std::vector<std::string> fCustom;  // the maker's own fields
};

// The areas in the content of a FRU device. Missing if its header is not one. An area that is cut short or has a wrong checksum
// is in the list, with that reason for each of its values. Areas of many records are not read.
TFinding<std::vector<TFruArea>> FruAreasFrom(std::string_view content);

// In place of the areas of a device that was not read: each value has this reason.
TFruArea UnreadArea(TMissing const& why);

// How much of the content FruAreasFrom needs, as far as its beginning shows. Devices are slow, and mostly empty.
std::size_t LengthOfAreas(std::string_view beginning);

}  // namespace NQRVZEP20
