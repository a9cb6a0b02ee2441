// SPDX-License-Identifier: Apache-2.0

// A library that calls a function which nobody has.

#include "ZEPExport.h"

extern "C" void ThereIsNoSuchFunction();
extern "C" ZEP_EXPORT void CallIt() { ThereIsNoSuchFunction(); }
