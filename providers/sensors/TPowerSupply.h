// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "providers/reasons/TFinding.h"
#include "providers/reasons/TMachineFiles.h"

#include <string>
#include <vector>

namespace NQRVZEP20 {

// A power supply of the type Mains or UPS in /sys/class/power_supply. Batteries and USB ports are left out.
struct TPowerSupply {
  std::string fName = {};                      // "ACAD"
  TFinding<bool> fIsOnline = TMissing{};       // whether it gets and gives power
  TFinding<std::string> fHealth = TMissing{};  // "Good", "Overheat", "Dead", …
  TFinding<std::string> fMaker = TMissing{}, fModel = TMissing{}, fSerialNumber = TMissing{};
};

std::vector<TPowerSupply> ReadPowerSupplies(TMachineFiles const& files);

}  // namespace NQRVZEP20
