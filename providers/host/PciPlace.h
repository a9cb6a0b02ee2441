// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "TSmbiosStructure.h"

#include <cstdint>
#include <string>

namespace NQRVZEP20 {

// The fields of a slot (type 9), and the bus address in it and in an onboard device (type 41).

TFinding<std::string> SlotTypeOf(TSmbiosStructure const& slot);         // "PCI Express 3 x16"
TFinding<std::uint16_t> SlotDataWidthOf(TSmbiosStructure const& slot);  // in bits; missing for a slot with lanes
TFinding<std::uint16_t> SlotLinkWidthOf(TSmbiosStructure const& slot);  // CIM_Slot.MaxLinkWidth; missing for a slot without lanes
TFinding<std::string> SlotUsageOf(TSmbiosStructure const& slot);        // "In use"

// "0000:03:00.0": segment, bus, device and function in the four bytes at the offset.
TFinding<std::string> PciAddressOf(TSmbiosStructure const& structure, std::size_t offset);

}  // namespace NQRVZEP20
