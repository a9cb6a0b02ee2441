// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "providers/reasons/TFinding.h"

#include <cstddef>
#include <cstdint>
#include <string>
#include <vector>

namespace NQRVZEP20 {

// The structure types that the host provider reads.
constexpr int kSmbiosBios = 0;
constexpr int kSmbiosSystem = 1;
constexpr int kSmbiosBoard = 2;
constexpr int kSmbiosChassis = 3;
constexpr int kSmbiosProcessor = 4;
constexpr int kSmbiosSlot = 9;
constexpr int kSmbiosOemStrings = 11;
constexpr int kSmbiosOptions = 12;
constexpr int kSmbiosMemoryArray = 16;
constexpr int kSmbiosMemoryDevice = 17;
constexpr int kSmbiosBoot = 32;
constexpr int kSmbiosIpmi = 38;
constexpr int kSmbiosOnboardDevice = 41;
constexpr int kSmbiosTpm = 43;

// One SMBIOS structure: a header of four bytes, the formatted area, and the string set. Never reads out of bounds, even if the
// structure is malformed. Numbers are little-endian; offsets are from the start of the header, as in the SMBIOS standard.
class TSmbiosStructure {
public:
  explicit TSmbiosStructure(std::vector<unsigned char> bytes);

  // A missing structure: every field is missing for that reason.
  explicit TSmbiosStructure(TMissing why);

  // Fields of the formatted area. Older versions of the standard have shorter structures: a field that is not completely within
  // the formatted area is missing.
  TFinding<std::uint8_t> Byte(std::size_t offset) const;
  TFinding<std::uint16_t> Word(std::size_t offset) const;
  TFinding<std::uint32_t> DWord(std::size_t offset) const;
  TFinding<std::uint64_t> QWord(std::size_t offset) const;
  TFinding<std::vector<unsigned char>> Bytes(std::size_t offset, std::size_t count) const;

  // The string to which the field at that offset refers, verbatim. Missing if the field is 0, the string set has fewer strings,
  // or the string is not terminated.
  TFinding<std::string> Text(std::size_t offset) const;

  // All strings of the string set, verbatim; none for a missing structure.
  std::vector<std::string> Texts() const;

  // The number by which other structures refer to this one. Missing only for a missing structure.
  TFinding<std::uint16_t> Handle() const { return Word(2); }

private:
  TFinding<std::string> StringAt(std::uint8_t number) const;
  std::size_t FormattedSize() const;

  std::vector<unsigned char> fBytes;
  TMissing fWhyAbsent;  // its code is empty when the structure is present
};

// A structure and the source of its values: "SMBIOS type 17".
struct TSourcedStructure {
  TSmbiosStructure fStructure;
  std::string fSource;
};

}  // namespace NQRVZEP20
