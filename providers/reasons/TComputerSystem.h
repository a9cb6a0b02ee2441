// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "TMachineFiles.h"
#include "TRecord.h"

#include <string>

namespace NQRVZEP20 {

// The computer system that the devices of a provider's namespace belong to.
//
//   TComputerSystem const system(files);
//   writer.Write(system.Record());
//   TRecord disk("CIM_DiskDrive", "sysfs");
//   system.AddDeviceKeys(disk, "sda");
//
// Copies share nothing.
class TComputerSystem {
public:
  // The name is the value of the environment variable ZEP_HOST_NAME, or otherwise the host name that the kernel reports.
  explicit TComputerSystem(TMachineFiles const& files);

  // An instance of CIM_ComputerSystem that has only its keys. The host provider's namespace has one with all the values.
  TRecord Record() const;

  // Adds the keys of a CIM_LogicalDevice; `id` must be unique within the class of the record.
  void AddDeviceKeys(TRecord& record, std::string const& id) const;

  // Adds the keys of an element that is hosted by the system, such as a CIM_ServiceAccessPoint.
  void AddHostedKeys(TRecord& record, std::string const& name) const;

private:
  void AddSystemKeys(TRecord& record) const;

  std::string fSource;
  TFinding<std::string> fName;
};

}  // namespace NQRVZEP20
