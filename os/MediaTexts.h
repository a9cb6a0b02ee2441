// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <optional>
#include <string>
#include <string_view>
#include <vector>

namespace NQRVZEP20 {

// Parsers of the texts that other programs and the kernel write about devices.

constexpr char kKeyMountPoint[] = "/mnt/key";
constexpr char kFloppyMountPoint[] = "/mnt/floppy";
constexpr char const* kFloppyDevices[] = {"/dev/floppy", "/dev/fd0", "/dev/fd1"};

// Where a device is mounted.
std::string MountPointOf(std::string const& device);

// The text without blanks, tabs and carriage returns at either end.
std::string Trimmed(std::string_view text);

// The device files in hwinfo's output for each device whose block has a line that contains `header` and, after it, a line that
// contains `marker`. Each is returned as hwinfo prints it: "/dev/sdc (/dev/sg3)".
std::vector<std::string> DeviceFilesIn(std::string_view hwinfoOutput, std::string_view header, std::string_view marker);

// "/dev/sdc (/dev/sg3)" becomes "/dev/sdc".
std::string WithoutAlias(std::string const& deviceFile);

struct TScsiAddress {
  int fHost, fChannel, fTarget, fLun;
};

inline bool operator==(TScsiAddress const& a, TScsiAddress const& b) {
  return a.fHost == b.fHost && a.fChannel == b.fChannel && a.fTarget == b.fTarget && a.fLun == b.fLun;
}

// Of "host:channel:target:lun", in decimal; empty for any other text.
std::optional<TScsiAddress> ScsiAddressFrom(std::string_view text);

// A device by its number on its USB.
struct TUsbDevice {
  int fBus, fDevice;
};

// Whether the kernel's list of USB devices contains the device.
bool Lists(std::string_view usbDevices, TUsbDevice const& device);

}  // namespace NQRVZEP20
