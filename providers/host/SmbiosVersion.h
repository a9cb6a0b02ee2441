// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <optional>
#include <string>
#include <string_view>
#include <utility>

namespace NQRVZEP20 {

// The version of the SMBIOS standard that tables follow: major and minor, 2.8 as {2, 8}.
using TSmbiosVersion = std::pair<unsigned, unsigned>;

// The version in an entry point of any of its three forms: "_SM3_", "_SM_", and "_DMI_" of before SMBIOS 2.1. Bytes after
// it are not looked at. None when the bytes do not begin with an entry point, or its length or checksum is wrong.
std::optional<TSmbiosVersion> VersionInEntryPoint(std::string_view bytes);

// The version of the tables in a file: in the entry point that the file begins with, as a dump does; for a bare table in the
// file smbios_entry_point of the same directory, which is where the kernel puts it. None when neither has one.
std::optional<TSmbiosVersion> VersionOfTables(std::string const& tableFile);

}  // namespace NQRVZEP20
