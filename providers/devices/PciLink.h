// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "providers/reasons/TFinding.h"

#include <cstdint>
#include <string>

namespace NQRVZEP20 {

// The transfer rate of a PCI Express lane in gigatransfers per second, from the kernel's text: "2.5 GT/s PCIe", "8.0 GT/s".
// Missing for "Unknown" and for any other text.
TFinding<float> PciTransferRateFrom(std::string const& text);

// The number of lanes. Missing for the numbers with which the kernel says that it does not know: 0 and 255.
TFinding<std::uint16_t> PciWidthFrom(std::uint16_t width);

// The data rate of a link in bits per second and direction, without the overhead of the encoding: 8 of 10 bits are data up to
// 5 GT/s, 128 of 130 up to 32 GT/s, and all bits above.
std::uint64_t PciSpeedFrom(float transferRate, std::uint16_t width);

}  // namespace NQRVZEP20
