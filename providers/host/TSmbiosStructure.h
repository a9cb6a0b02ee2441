// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "providers/reasons/TFinding.h"

#include <cstddef>
#include <cstdint>
#include <string>
#include <vector>

namespace NQRVZEP20 {

// The structure types that are read.
constexpr int kSmbiosBios = 0;
constexpr int kSmbiosSystem = 1;
constexpr int kSmbiosChassis = 3;
constexpr int kSmbiosProcessor = 4;
constexpr int kSmbiosMemoryDevice = 17;

// One SMBIOS structure: a header of four bytes, the formatted area, and the string set behind it. Whatever the bytes say,
// nothing outside them is read. Numbers are little-endian; offsets count from the header, as the SMBIOS standard's do.
class TSmbiosStructure {
public:
  explicit TSmbiosStructure(std::vector<unsigned char> bytes);

  // The structure that is not there: every field is missing, for that reason.
  explicit TSmbiosStructure(TMissing why);

  // Fields of the formatted area. Firmware of an older version of the standard gives shorter structures: a field that does
  // not lie within the formatted area is missing.
  TFinding<std::uint8_t> Byte(std::size_t offset) const;
  TFinding<std::uint16_t> Word(std::size_t offset) const;
  TFinding<std::uint32_t> DWord(std::size_t offset) const;
  TFinding<std::vector<unsigned char>> Bytes(std::size_t offset, std::size_t count) const;

  // The text whose number stands at that offset, as the firmware wrote it. Missing when the number is 0, when the string
  // set has fewer texts, and when the text has no end.
  TFinding<std::string> Text(std::size_t offset) const;

private:
  TFinding<std::string> StringAt(std::uint8_t number) const;
  std::size_t FormattedSize() const;

  std::vector<unsigned char> fBytes;
  TMissing fWhyAbsent;  // without code: the structure is there
};

}  // namespace NQRVZEP20
