// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "OsRelease.h"
#include "TSystemName.h"
#include "providers/reasons/TRecord.h"

#include <string>

struct utsname;

namespace NQRVZEP20 {

// The operating system and this collector as records of CIM classes.

// The machine's host name, or the value of the environment variable ZEP_HOST_NAME, so that the table of another machine
// (ZEP_SMBIOS_TABLE) can be reported under that machine's name.
TSystemName SystemNameOf(utsname const& kernel);

TRecord OperatingSystemRecord(TOsRelease const& release, utsname const& kernel, TSystemName const& name);

// The version of the project and the configured build (ZEP_BUILD_ID of CMake).
TRecord ProductRecord();

}  // namespace NQRVZEP20
