// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <cstdint>
#include <string>
#include <string_view>
#include <vector>

namespace NQRVZEP20 {

// The numbers that identify a PCI device.
struct TPciNumbers {
  std::uint16_t fVendor;
  std::uint16_t fDevice;
  std::uint16_t fSubsystemVendor;  // both 0 for a device without a subsystem
  std::uint16_t fSubsystem;
  std::uint32_t fClass;  // class, subclass and programming interface: 0x020000
};

// Finds names in the text of the list of PCI identifiers (pci.ids). In the list, a line without indentation is a vendor or, after
// "C ", a class. A line below it that begins with one tab is a device or a subclass, with two tabs a subsystem. Each name is
// empty if the list does not contain its number.
//
// Refers to the text, which must outlive the object. Several threads may use one object.
class TPciIdList {
public:
  explicit TPciIdList(std::string_view text);

  std::string VendorOf(TPciNumbers const& numbers) const;
  std::string DeviceOf(TPciNumbers const& numbers) const;
  // A subsystem that is not in the list and has the numbers of the device itself has the name of the device.
  std::string SubsystemOf(TPciNumbers const& numbers) const;
  // The name of the subclass. Without one, that of the class and both numbers: "Unassigned class [ff00]".
  std::string ClassOf(TPciNumbers const& numbers) const;

private:
  std::vector<std::string_view> fBlocks;  // each vendor or class with the lines below it
};

}  // namespace NQRVZEP20
