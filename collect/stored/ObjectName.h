// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "collect/stored/StoredReport.h"

#include <string>

namespace NQRVZEP20 {

// The name of an object for people: its ElementName, Name, DeviceID, Tag or InstanceID, whichever it has first, and in
// parentheses its size, maker, part and serial number as far as they are known: "DIMM 2 (16 GiB, Example Works, EW16R32-D4,
// EX4100074)". An object without any of these names has its path.
std::string ObjectName(TStoredInstance const& instance);

}  // namespace NQRVZEP20
