// SPDX-License-Identifier: Apache-2.0
#pragma once

// The names that the DMTF schema gives to the numbers of enumerated properties.

#include "providers/reasons/SensorValueNames.h"

namespace NQRVZEP20 {

constexpr TValueName kEnabledStateNames[] = {{"0", "Unknown"}, {"2", "Enabled"}, {"3", "Disabled"}};
constexpr TValueName kPackageTypeNames[] = {{"0", "Unknown"}, {"1", "Other"}, {"3", "Chassis/Frame"}, {"9", "Module/Card"}};
constexpr TValueName kRateUnitsNames[] = {
    {"0", "None"},     {"1", "Per MicroSecond"}, {"2", "Per MilliSecond"}, {"3", "Per Second"}, {"4", "Per Minute"},
    {"5", "Per Hour"}, {"6", "Per Day"},         {"7", "Per Week"},        {"8", "Per Month"},  {"9", "Per Year"}};

}  // namespace NQRVZEP20
