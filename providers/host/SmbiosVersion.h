// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "providers/reasons/TFinding.h"

#include <optional>
#include <string>
#include <string_view>
#include <utility>

namespace NQRVZEP20 {

// The version of the SMBIOS standard that the tables conform to, as major and minor: 2.8 is {2, 8}.
using TSmbiosVersion = std::pair<unsigned, unsigned>;

// The version in an entry point of any of the three forms: "_SM3_", "_SM_", and "_DMI_" from before SMBIOS 2.1. Bytes after the
// entry point are ignored. None if the bytes do not begin with an entry point, or its length or checksum is wrong.
std::optional<TSmbiosVersion> VersionInEntryPoint(std::string_view bytes);

// The version of the tables in a file, from the entry point with which a dump begins; for a bare table, from the file
// smbios_entry_point in the same directory, where the kernel has it. An empty value when neither contains an entry point; missing
// when one of the files exists but cannot be read.
TFinding<std::optional<TSmbiosVersion>> VersionOfTables(std::string const& tableFile);

}  // namespace NQRVZEP20
