// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <string_view>

namespace smbios {

// A structure as it is in the table: byte 0 is the type, byte 1 the length of the formatted area (at least 4), bytes 2 and 3 are
// the handle; after the formatted area follows the string set, which ends with two zero bytes. A view into the table, never a
// copy; an empty one means "none".
using TStructure = std::string_view;

constexpr int kEndOfTableType = 127;

int TypeOf(TStructure structure);  // the structure must not be empty

// Returns the structures of a DMI table one after the other. Nothing outside the table is read, whatever its bytes are, and each
// step moves forward. The table must outlive the reader.
class TStructureReader {
public:
  TStructureReader() = default;  // is at the end
  explicit TStructureReader(std::string_view table) : fRest(table) {}

  // The next structure. None after the end-of-table structure, and none from the first incomplete structure on: its formatted
  // area is shorter than 4 bytes or extends beyond the table, or the two zero bytes are missing.
  TStructure Next();

  TStructure NextOfType(int type);

private:
  std::string_view fRest;  // not read yet
};

// The DMI table in the bytes of a file. In a file that begins with an entry point ("_SM3_", "_SM_" or "_DMI_") it is the part to
// which the entry point refers, cut at the end of the file; any other file is a bare table. Empty when the entry point's length,
// checksum or table address is invalid; but "_DMI_" without a valid checksum may be the start of a bare table, and counts as one.
std::string_view DmiTableIn(std::string_view file);

}  // namespace smbios
