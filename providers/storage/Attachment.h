// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "TBlockDevice.h"

#include <string>

namespace NQRVZEP20 {

// How a drive is attached to the machine, from the path of its device in sysfs.
struct TAttachment {
  TFinding<std::string> fDevicePath;  // the directory of the SCSI, NVMe, virtio or memory card device
  TFinding<std::string> fTransport;   // "sata", "ata", "sas", "fc", "iscsi", "spi", "nvme", "usb", "virtio", "mmc", "sd", "xen"
  TFinding<unsigned long> fSpeed;     // of the link to the drive, in bits per second
  TFinding<std::string> fPciPath;     // the directory of the PCI function through which the drive is reached

  // The SCSI address "host:channel:target:lun". Missing for other drives.
  TFinding<std::string> ScsiAddress() const;
};

TAttachment AttachmentOf(TMachineFiles const& files, TBlockDevice const& drive);

// Parses a speed as kernel files state it: "6.0 Gbps", "12.0 Gbit", "480" (megabits), "8.0 GT/s PCIe". `source` is for the
// reason.
TFinding<unsigned long> SpeedFrom(std::string const& text, std::string const& source);

// Whether the text is the address of a PCI function: "0000:00:1f.2".
bool IsPciAddress(std::string const& text);

}  // namespace NQRVZEP20
