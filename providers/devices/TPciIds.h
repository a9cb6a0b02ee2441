// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "providers/reasons/TMachineFiles.h"

#include <cstdint>
#include <memory>
#include <string>

namespace NQRVZEP20 {

// The numbers that identify a PCI device.
struct TPciNumbers {
  std::uint16_t fVendor;
  std::uint16_t fDevice;
  std::uint16_t fSubsystemVendor;  // both 0 for a device without a subsystem
  std::uint16_t fSubsystem;
  std::uint32_t fClass;  // class, subclass and programming interface: 0x020000
};

// The names of a device; each is missing if the list of PCI identifiers does not contain the number.
struct TPciNames {
  TFinding<std::string> fVendor;
  TFinding<std::string> fDevice;
  TFinding<std::string> fSubsystem;
  TFinding<std::string> fClass;
};

// Looks up names in the list of PCI identifiers (pci.ids) through libpci. The list is read at the first lookup.
//
// Not synchronised: use one object from one thread at a time.
class TPciIds {
public:
  TPciIds();
  ~TPciIds();
  TPciIds(TPciIds const&) = delete;
  TPciIds& operator=(TPciIds const&) = delete;

  // The names, or those that were recorded with the machine (TMachineFiles::Answer).
  TPciNames NamesOf(TPciNumbers const& numbers, TMachineFiles const& files);

private:
  std::string Lookup(TPciNumbers const& numbers);

  struct TAccess;
  std::unique_ptr<TAccess> fAccess;
};

}  // namespace NQRVZEP20
