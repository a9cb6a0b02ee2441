#pragma once

#include <string>

namespace NQRVZEP20 {

// Numbers as a standard stream in the classic locale writes them, whatever the process's locale is.

std::string DecimalText(unsigned long number);
std::string DecimalText(long number);
std::string OctalText(unsigned long number);                     // without padding
std::string HexText(unsigned long number, unsigned int digits);  // in capitals, the lowest `digits` digits, an even number

// Six significant digits, fixed or with an exponent as the general format chooses.
std::string RealText(double number);

}  // namespace NQRVZEP20
