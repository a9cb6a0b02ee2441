// SPDX-License-Identifier: Apache-2.0
#include "TPowerSupply.h"

namespace NQRVZEP20 {

namespace {

std::string const kClass = "/sys/class/power_supply/";

// Mains and UPS. A USB port is one only while a charger is plugged in, and an empty one is no fault. Devices outside of the
// machine, such as a mouse, report their own supplies, with the scope "Device".
bool SuppliesTheMachine(TMachineFiles const& files, std::string const& directory) {
  auto const type = files.Line(directory + "type"), scope = files.Line(directory + "scope");
  return type && (*type == "Mains" || *type == "UPS") && !(scope && *scope == "Device");
}

}  // namespace

std::vector<TPowerSupply> ReadPowerSupplies(TMachineFiles const& files) {
  std::vector<TPowerSupply> supplies;
  for (std::string const& name : files.Names(kClass)) {
    std::string const directory = kClass + name + "/";
    if (!SuppliesTheMachine(files, directory)) continue;
    auto const isOnline = files.Number<int>(directory + "online").Then([](int online) { return online != 0; });
    supplies.push_back({name, isOnline, files.Line(directory + "health"), files.Line(directory + "manufacturer"),
                        files.Line(directory + "model_name"), files.Line(directory + "serial_number")});
  }
  return supplies;
}

}  // namespace NQRVZEP20
