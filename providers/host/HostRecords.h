// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "OsRelease.h"
#include "TSystemName.h"
#include "providers/reasons/TRecord.h"

#include <string>

struct utsname;

namespace NQRVZEP20 {

// What the operating system and this collector say of themselves.

// The machine's name on the network, or what the environment variable ZEP_HOST_NAME says: with it a table of another
// machine (ZEP_SMBIOS_TABLE) need not go by the name of this one.
TSystemName SystemNameOf(utsname const& kernel);

TRecord OperatingSystemRecord(TOsRelease const& release, utsname const& kernel, TSystemName const& name);

// The project's version and the build that it was configured with (CMake's ZEP_BUILD_ID).
TRecord ProductRecord();

}  // namespace NQRVZEP20
