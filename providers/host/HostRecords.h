// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "KernelNames.h"
#include "MemoryTotals.h"
#include "OsRelease.h"
#include "TSystemName.h"
#include "providers/reasons/TRecord.h"

namespace NQRVZEP20 {

// The operating system and this collector as records of CIM classes.

TRecord OperatingSystemRecord(TOsRelease const& release, TKernelNames const& kernel, TMemInfo const& memory,
                              TMachineFiles const& files, TSystemName const& name);

// The version of the project and the configured build (ZEP_BUILD_ID of CMake).
TRecord ProductRecord();

}  // namespace NQRVZEP20
