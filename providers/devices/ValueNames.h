// SPDX-License-Identifier: Apache-2.0
#pragma once

// The names that the DMTF schema gives to the numbers of enumerated properties.

#include "providers/reasons/TRecord.h"

namespace NQRVZEP20 {

constexpr TValueName kClassCodeNames[] = {{"0", "Pre 2.0"},
                                          {"1", "Mass Storage"},
                                          {"2", "Network"},
                                          {"3", "Display"},
                                          {"4", "Multimedia"},
                                          {"5", "Memory"},
                                          {"6", "Bridge"},
                                          {"7", "Simple Communications"},
                                          {"8", "Base Peripheral"},
                                          {"9", "Input"},
                                          {"10", "Docking Station"},
                                          {"11", "Processor"},
                                          {"12", "Serial Bus"},
                                          {"13", "Wireless"},
                                          {"14", "Intelligent I/O"},
                                          {"15", "Satellite Communication"},
                                          {"16", "Encryption/Decryption"},
                                          {"17", "Data Acquisition and Signal Processing"},
                                          {"18..254", "PCI Reserved"},
                                          {"255", "Other"}};
constexpr TValueName kBridgeTypeNames[] = {{"0", "Host"},    {"1", "ISA"},           {"2", "EISA"},  {"3", "Micro Channel"},
                                           {"4", "PCI"},     {"5", "PCMCIA"},        {"6", "NuBus"}, {"7", "CardBus"},
                                           {"8", "RACEway"}, {"9", "AGP"},           {"10", "PCIe"}, {"11", "PCIe-to-PCI"},
                                           {"128", "Other"}, {"..", "DMTF Reserved"}};
constexpr TValueName kPortTypeNames[] = {{"0", "Unknown"},      {"1", "Other"},          {"2", "Not Applicable"},
                                         {"150", "PCI"},        {"151", "PCI-X"},        {"152", "PCIe"},
                                         {"153", "PCIe Gen 2"}, {"..", "DMTF Reserved"}, {"16000..65535", "Vendor Reserved"}};

constexpr TValueName kInterruptPinNames[] = {{"0", "None"},  {"1", "INTA#"}, {"2", "INTB#"},
                                             {"3", "INTC#"}, {"4", "INTD#"}, {"5", "Unknown"}};

}  // namespace NQRVZEP20
