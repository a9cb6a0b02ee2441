// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <string_view>

namespace smbios {

// A structure as stored in the table: byte 0 is the type, byte 1 the length of the formatted area (at least 4), bytes 2 and 3
// are the handle. The formatted area is followed by the string set, which ends with two zero bytes. This is a view into the
// table, never a copy; an empty view means "no structure".
using TStructure = std::string_view;

constexpr int kEndOfTableType = 127;

int TypeOf(TStructure structure);  // the structure must not be empty

// Returns the structures of a DMI table one by one. Whatever the bytes are, nothing outside the table is read, and each call
// advances. The table must outlive the reader.
class TStructureReader {
public:
  TStructureReader() = default;  // a reader that is at its end
  explicit TStructureReader(std::string_view table) : fRest(table) {}

  // The next structure; empty at the end, which is after the end-of-table structure or before the first incomplete structure. A
  // structure is incomplete when its formatted area is shorter than 4 bytes or extends beyond the table, or when the two zero
  // bytes are missing.
  TStructure Next();

  // The next structure of that type; empty, and at the end, when there is none.
  TStructure NextOfType(int type);

private:
  std::string_view fRest;  // not read yet
};

// Returns the DMI table in the bytes of a file. In a file that begins with an entry point ("_SM3_", "_SM_" or "_DMI_") the table
// is the part to which the entry point refers, cut at the end of the file; any other file is a bare table. Empty when the entry
// point's length, checksum or table address is invalid. "_DMI_" without a valid checksum is treated as the start of a bare
// table.
std::string_view DmiTableIn(std::string_view file);

}  // namespace smbios
