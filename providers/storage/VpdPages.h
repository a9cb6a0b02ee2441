// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "providers/reasons/TFinding.h"

#include <string>
#include <string_view>
#include <vector>

namespace NQRVZEP20 {

// Parsers of the pages of vital product data (VPD) of SCSI and ATA disks, as the kernel exports them: a header of four bytes and
// the content. They accept any bytes: what lies outside of the page is not read.

// Page 80, unit serial number.
TFinding<std::string> SerialNumberFrom(std::string_view page80);

// A name of a logical unit that is unique in the world.
struct TDesignator {
  std::string fFormat;  // "NAA", "EUI64", "T10 vendor ID" or "UUID"
  std::string fText;    // hexadecimal digits in lower case, or for a vendor ID the text
};

// Page 83, device identification: the designators of the logical unit, in the order of the page.
std::vector<TDesignator> DesignatorsFrom(std::string_view page83);

// Page B1, block device characteristics.
struct TCharacteristics {
  TFinding<unsigned> fRotationsPerMinute;  // 0 for a disk that does not rotate
  TFinding<unsigned> fFormFactor;          // the code of the page: 1 for 5.25 inch to 4 for 1.8 inch, 5 for less
};
TCharacteristics CharacteristicsFrom(std::string_view pageB1);

// Page 89, ATA information: the texts of the data that the command IDENTIFY DEVICE returns. They are longer than those of the
// SCSI inquiry, which cuts the model after 16 characters and the firmware version after 4.
struct TAtaIdentity {
  TFinding<std::string> fSerialNumber, fFirmware, fModel;
  TFinding<unsigned> fRotationsPerMinute;  // 0 for a disk that does not rotate
  TFinding<unsigned> fFormFactor;          // the codes of page B1
};
TAtaIdentity AtaIdentityFrom(std::string_view page89);

}  // namespace NQRVZEP20
