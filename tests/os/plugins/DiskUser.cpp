// SPDX-License-Identifier: Apache-2.0

// A collection plug-in that calls a function of another one, without being linked with it.

#include "ZEPExport.h"

extern "C" int DiskCount();
extern "C" ZEP_EXPORT int TwiceTheDiskCount() { return 2 * DiskCount(); }
