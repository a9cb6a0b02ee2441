// SPDX-License-Identifier: Apache-2.0
#include "PciAddress.h"

#include <cstdio>

namespace NQRVZEP20 {

std::optional<TPciAddress> PciAddressFrom(std::string const& text) {
  unsigned domain = 0, bus = 0, device = 0, function = 0;
  int length = 0;
  int const count = std::sscanf(text.c_str(), "%8x:%2x:%2x.%1x%n", &domain, &bus, &device, &function, &length);
  if (count != 4 || static_cast<std::size_t>(length) != text.size() || device > 0x1f || function > 7) return std::nullopt;
  return TPciAddress{domain, static_cast<std::uint8_t>(bus), static_cast<std::uint8_t>(device),
                     static_cast<std::uint8_t>(function)};
}

}  // namespace NQRVZEP20
