// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <cstddef>
#include <cstdint>
#include <string>
#include <string_view>
#include <vector>

namespace NQRVZEP20 {

// The link modes of ethtool: bits of a mask, such as bit 5 for "1000baseT/Full". A mask consists of words of 32 bits in the
// machine's byte order. Other bits stand for connectors, pause frames and error correction.

// A mode of transmission.
struct TLinkMode {
  std::string fName;     // "1000baseT/Full"
  std::uint64_t fSpeed;  // bits per second
  bool fIsFullDuplex;
};

// The modes of transmission in a mask, in the order of the bits. A bit that this table does not know is ignored.
std::vector<TLinkMode> LinkModesIn(std::string_view mask);

// The names of the other bits in a mask: "Autoneg", "TP", "Pause", "FEC_RS".
std::vector<std::string> LinkFeaturesIn(std::string_view mask);

// The value of CIM_EthernetPort.PortType for the mode; 0 if the schema has none.
std::uint16_t PortTypeOf(TLinkMode const& mode);

}  // namespace NQRVZEP20
