// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "providers/reasons/TComputerSystem.h"
#include "providers/reasons/TMachineFiles.h"
#include "providers/reasons/TRecord.h"

#include <cstdint>
#include <string>
#include <vector>

namespace NQRVZEP20 {

// The USB devices of a machine as records of CIM classes, from /sys/bus/usb.

struct TUsbDevice {
  std::string fName;        // "1-2.3"; "usb1" for the root hub of the first bus
  std::string fHub;         // the name of the hub above; empty for a root hub
  std::string fController;  // the name of the PCI function that controls it; empty if there is none
  bool fIsHub;
  TFinding<std::uint64_t> fSpeed;  // negotiated, in bits per second
  TRecord fRecord;                 // CIM_USBDevice or CIM_USBHub
};

// In the order of their names. A device that is removed during the call is omitted.
std::vector<TUsbDevice> UsbDevices(TMachineFiles const& files, TComputerSystem const& system);

// The negotiated speed in bits per second, from the kernel's number of megabits: "480", "1.5".
TFinding<std::uint64_t> UsbSpeedFrom(std::string const& text);

// A version in binary-coded decimal form, from the kernel's text: 0x0210 for "2.10".
TFinding<std::uint16_t> UsbVersionFrom(std::string const& text);

// Records without values, which declare the classes, and the reason why there are no instances.
TRecord UsbDeviceShape(TComputerSystem const& system);
TRecord UsbHubShape(TComputerSystem const& system);
TMissing WhyNoUsbDevices(TMachineFiles const& files);

}  // namespace NQRVZEP20
