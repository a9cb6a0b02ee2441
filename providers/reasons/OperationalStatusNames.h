// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "TRecord.h"

namespace NQRVZEP20 {

// The names that the DMTF schema gives to the values of OperationalStatus.
constexpr TValueName kOperationalStatusNames[] = {{"0", "Unknown"},
                                                  {"1", "Other"},
                                                  {"2", "OK"},
                                                  {"3", "Degraded"},
                                                  {"4", "Stressed"},
                                                  {"5", "Predictive Failure"},
                                                  {"6", "Error"},
                                                  {"7", "Non-Recoverable Error"},
                                                  {"8", "Starting"},
                                                  {"9", "Stopping"},
                                                  {"10", "Stopped"},
                                                  {"11", "In Service"},
                                                  {"12", "No Contact"},
                                                  {"13", "Lost Communication"},
                                                  {"14", "Aborted"},
                                                  {"15", "Dormant"},
                                                  {"16", "Supporting Entity in Error"},
                                                  {"17", "Completed"},
                                                  {"18", "Power Mode"},
                                                  {"19", "Relocating"},
                                                  {"..", "DMTF Reserved"},
                                                  {"0x8000..", "Vendor Reserved"}};

}  // namespace NQRVZEP20
