// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "TBlockDevice.h"
#include "providers/reasons/TComputerSystem.h"
#include "providers/reasons/TIdentifiers.h"
#include "providers/reasons/TRecord.h"

#include <string>
#include <vector>

namespace NQRVZEP20 {

// Volumes that the kernel makes of other extents.

// The state of a volume: values of OperationalStatus, and a text for each.
struct TVolumeStatus {
  std::vector<unsigned short> fCodes;
  std::vector<std::string> fTexts;

  void Add(unsigned short code, std::string text) {
    fCodes.push_back(code);
    fTexts.push_back(std::move(text));
  }
};

// What volumes of all kinds have in common. `className`: CIM_StorageVolume, or one that has it as `superClass`. `names`: its
// further names.
TRecord VolumeRecord(char const* className, TMachineFiles const& files, TBlockDevice const& device, TComputerSystem const& system,
                     TFinding<std::string> const& elementName, TIdentifiers const& names, TFinding<TVolumeStatus> const& status,
                     std::string const& superClass = "");

// A CIM_StorageVolume of the device mapper: an LVM volume, an encrypted device, a multipath device.
TRecord MappedVolumeRecord(TMachineFiles const& files, TBlockDevice const& device, TComputerSystem const& system);

// The name of a device of the device mapper for people: "group/volume" for an LVM volume, whose name has the form "group-volume"
// with doubled hyphens in both parts.
std::string MappedNameFrom(std::string const& name, std::string const& uuid);

// The kernel's names of the devices that a device is made of.
std::vector<std::string> DevicesBelow(TMachineFiles const& files, TBlockDevice const& device);

}  // namespace NQRVZEP20
