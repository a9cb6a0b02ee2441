// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "TPciIdList.h"
#include "providers/reasons/TMachineFiles.h"

#include <memory>
#include <string>

namespace NQRVZEP20 {

// The names of a device; each is missing if the list of PCI identifiers does not contain the number.
struct TPciNames {
  TFinding<std::string> fVendor;
  TFinding<std::string> fDevice;
  TFinding<std::string> fSubsystem;
  TFinding<std::string> fClass;
};

// Looks up names in the list of PCI identifiers (pci.ids) of this machine. The list is opened at the first lookup.
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
  TFinding<std::string> Lookup(TPciNumbers const& numbers);

  struct TMappedList;
  std::unique_ptr<TMappedList> fList;
};

}  // namespace NQRVZEP20
