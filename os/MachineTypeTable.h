// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <string_view>

namespace NQRVZEP20 {

// The server families by the prefix of their BIOS builds. The table is searched in this order.
struct TMachineTypeRow {
  std::string_view fBuildPrefix;  // two characters, lower case
  std::string_view fMachineType;  // four digits
};

inline constexpr TMachineTypeRow kMachineTypeTable[] = {
    {"qa", "1234"}, {"qc", "1240"}, {"qd", "1246"}, {"qf", "2310"}, {"qg", "2316"}, {"qh", "2322"},
    {"qj", "3450"}, {"qk", "3456"}, {"ql", "3462"}, {"qn", "4570"}, {"qp", "4576"}, {"qr", "4582"},
    {"qs", "5678"}, {"qt", "5684"}, {"qv", "6790"}, {"qw", "6796"}, {"qx", "7810"},
};

}  // namespace NQRVZEP20
