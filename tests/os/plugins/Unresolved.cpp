// SPDX-License-Identifier: Apache-2.0

// A library that calls a function which does not exist.

#include "ZEPExport.h"

extern "C" void ThereIsNoSuchFunction();
extern "C" ZEP_EXPORT void CallIt() { ThereIsNoSuchFunction(); }
