// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <string_view>

namespace smbios {

// A structure as the table holds it: byte 0 type, byte 1 length of the formatted area (at least 4), bytes 2 and 3 its
// handle; behind the formatted area the string set, which two zero bytes end. A view into the table, never a copy; an
// empty one stands for "none".
using TStructure = std::string_view;

constexpr int kEndOfTableType = 127;

int TypeOf(TStructure structure);  // of one that is not empty

// Takes the structures out of a DMI table one after the other. Nothing outside the table is read, whatever its bytes say,
// and each step moves forward. The table must outlive the reader.
class TStructureReader {
public:
  TStructureReader() = default;  // at the end already
  explicit TStructureReader(std::string_view table) : fRest(table) {}

  // The next structure. None behind the end-of-table structure, nor from the first one on that is not whole: its
  // formatted area is shorter than 4 bytes or leaves the table, or two zero bytes do not follow.
  TStructure Next();

  TStructure NextOfType(int type);

private:
  std::string_view fRest;  // what is still to be read
};

// The DMI table in the bytes of a file: all of a bare table; of a file that begins with an entry point ("_SM3_", "_SM_" or
// "_DMI_") the part that this one names, cut where the file ends. Empty when the entry point's anchor, length, checksum or
// table address cannot be right; but "_DMI_" without a sound checksum may be the start of a bare table, and counts as one.
std::string_view DmiTableIn(std::string_view file);

}  // namespace smbios
