// SPDX-License-Identifier: Apache-2.0
#pragma once

// The names that the DMTF schema gives to the numbers of enumerated properties of sensors and logs.

#include "OperationalStatusNames.h"

namespace NQRVZEP20 {

constexpr TValueName kSensorTypeNames[] = {{"0", "Unknown"},
                                           {"1", "Other"},
                                           {"2", "Temperature"},
                                           {"3", "Voltage"},
                                           {"4", "Current"},
                                           {"5", "Tachometer"},
                                           {"6", "Counter"},
                                           {"7", "Switch"},
                                           {"8", "Lock"},
                                           {"9", "Humidity"},
                                           {"10", "Smoke Detection"},
                                           {"11", "Presence"},
                                           {"12", "Air Flow"},
                                           {"13", "Power Consumption"},
                                           {"14", "Power Production"},
                                           {"15", "Pressure"},
                                           {"16", "Intrusion"},
                                           {"..", "DMTF Reserved"},
                                           {"32768..65535", "Vendor Reserved"}};
constexpr TValueName kBaseUnitsNames[] = {{"0", "Unknown"},       {"1", "Other"},        {"2", "Degrees C"},
                                          {"3", "Degrees F"},     {"4", "Degrees K"},    {"5", "Volts"},
                                          {"6", "Amps"},          {"7", "Watts"},        {"8", "Joules"},
                                          {"9", "Coulombs"},      {"10", "VA"},          {"11", "Nits"},
                                          {"12", "Lumens"},       {"13", "Lux"},         {"14", "Candelas"},
                                          {"15", "kPa"},          {"16", "PSI"},         {"17", "Newtons"},
                                          {"18", "CFM"},          {"19", "RPM"},         {"20", "Hertz"},
                                          {"21", "Seconds"},      {"22", "Minutes"},     {"23", "Hours"},
                                          {"24", "Days"},         {"25", "Weeks"},       {"26", "Mils"},
                                          {"27", "Inches"},       {"28", "Feet"},        {"29", "Cubic Inches"},
                                          {"30", "Cubic Feet"},   {"31", "Meters"},      {"32", "Cubic Centimeters"},
                                          {"33", "Cubic Meters"}, {"34", "Liters"},      {"35", "Fluid Ounces"},
                                          {"36", "Radians"},      {"37", "Steradians"},  {"38", "Revolutions"},
                                          {"39", "Cycles"},       {"40", "Gravities"},   {"41", "Ounces"},
                                          {"42", "Pounds"},       {"43", "Foot-Pounds"}, {"44", "Ounce-Inches"},
                                          {"45", "Gauss"},        {"46", "Gilberts"},    {"47", "Henries"},
                                          {"48", "Farads"},       {"49", "Ohms"},        {"50", "Siemens"},
                                          {"51", "Moles"},        {"52", "Becquerels"},  {"53", "PPM (parts/million)"},
                                          {"54", "Decibels"},     {"55", "DbA"},         {"56", "DbC"},
                                          {"57", "Grays"},        {"58", "Sieverts"},    {"59", "Color Temperature Degrees K"},
                                          {"60", "Bits"},         {"61", "Bytes"},       {"62", "Words (data)"},
                                          {"63", "DoubleWords"},  {"64", "QuadWords"},   {"65", "Percentage"},
                                          {"66", "Pascals"}};
constexpr TValueName kOverwritePolicyNames[] = {{"0", "Unknown"},  {"2", "Wraps When Full"}, {"7", "Never Overwrites"},
                                                {"8", "Archives"}, {"..", "DMTF Reserved"},  {"32768..65535", "Vendor Reserved"}};
constexpr TValueName kLogStateNames[] = {{"0", "Unknown"},        {"2", "Normal"},         {"3", "Erasing"},
                                         {"4", "Not Applicable"}, {"..", "DMTF Reserved"}, {"32768..65535", "Vendor Reserved"}};
constexpr TValueName kPerceivedSeverityNames[] = {
    {"0", "Unknown"}, {"1", "Other"}, {"2", "Information"}, {"3", "Degraded/Warning"},
    {"4", "Minor"},   {"5", "Major"}, {"6", "Critical"},    {"7", "Fatal/NonRecoverable"}};

}  // namespace NQRVZEP20
