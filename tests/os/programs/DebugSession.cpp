// SPDX-License-Identifier: Apache-2.0

// Starts a debug session where the library wants its file.

#include "TOSSpecific.h"

int main() { return NQRVZEP20::TOSSpecific::SetDebugLevel(3, nullptr) ? 0 : 1; }
