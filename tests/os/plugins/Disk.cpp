// SPDX-License-Identifier: Apache-2.0

// A collection plug-in that another one builds on.

#include "ZEPExport.h"

extern "C" ZEP_EXPORT int DiskCount() { return 2; }
