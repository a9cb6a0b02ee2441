// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <cstdint>
#include <optional>
#include <string>

namespace NQRVZEP20 {

// The address of a PCI function: "0000:03:00.0" is domain, bus, device and function, in hexadecimal digits.
struct TPciAddress {
  std::uint32_t fDomain;
  std::uint8_t fBus;
  std::uint8_t fDevice;
  std::uint8_t fFunction;
};

// None if the text is not exactly an address.
std::optional<TPciAddress> PciAddressFrom(std::string const& text);

}  // namespace NQRVZEP20
