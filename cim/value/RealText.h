// SPDX-License-Identifier: Apache-2.0
#pragma once

namespace NQRVZEP20 {

// Writes a real number to `place` as a standard stream in the classic locale writes it, whatever the process's locale is:
// six significant digits in the general format (%g). Returns the end of the text, which has at most 13 characters. Nothing
// is written beyond that end.
char* PutReal(char* place, double number);

}  // namespace NQRVZEP20
