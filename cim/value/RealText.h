#pragma once

namespace NQRVZEP20 {

// Writes a real at `place` as a standard stream in the classic locale writes it, whatever the process's locale is: with six
// significant digits, fixed or with an exponent as the general format chooses. Returns the end of the text, which has at
// most 13 characters; nothing is written behind it.
char* PutReal(char* place, double number);

}  // namespace NQRVZEP20
