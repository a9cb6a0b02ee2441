// SPDX-License-Identifier: Apache-2.0
#include "platform/smbios/SmbiosTable.h"

#include <cstddef>
#include <cstdint>
#include <numeric>

namespace smbios {
namespace {

using namespace std::string_view_literals;

constexpr std::size_t kHeaderSize = 4;

std::size_t ByteAt(std::string_view bytes, std::size_t offset) { return static_cast<unsigned char>(bytes[offset]); }

// `size` bytes, the least significant first.
std::uint64_t NumberAt(std::string_view bytes, std::size_t offset, std::size_t size) {
  std::uint64_t number = 0;
  while (size-- > 0) number = number << 8 | ByteAt(bytes, offset + size);
  return number;
}

// The complete structure at the start of the bytes; empty when there is none.
TStructure FirstStructureOf(std::string_view bytes) {
  if (bytes.size() < kHeaderSize) return {};
  std::size_t const formattedLength = ByteAt(bytes, 1);
  if (formattedLength < kHeaderSize || formattedLength > bytes.size()) return {};
  std::size_t const setEnd = bytes.find("\0\0"sv, formattedLength);
  if (setEnd == bytes.npos) return {};
  return bytes.substr(0, setEnd + 2);
}

bool StartsWith(std::string_view bytes, std::string_view start) { return bytes.substr(0, start.size()) == start; }

// The bytes of a valid entry point add up to 0.
bool IsSumZero(std::string_view bytes) {
  return std::accumulate(bytes.begin(), bytes.end(), 0u,
                         [](unsigned sum, char byte) { return (sum + static_cast<unsigned char>(byte)) & 0xFFu; }) == 0;
}

// The offsets of the entry point's fields that are read here. All of them are within `minLength` bytes.
struct TEntryPointLayout {
  std::string_view fAnchor;
  std::size_t fMinLength, fMaxLength;  // allowed values of the length byte
  std::size_t fLengthOffset;
  std::size_t fTableSizeOffset, fTableSizeBytes;
  std::size_t fTableAddressOffset, fTableAddressBytes;
  bool fHasInnerPart;  // the inner part has its own anchor and checksum
};

// Some firmware is known to give the length 0x1E where 0x1F is correct.
constexpr TEntryPointLayout kEntryPoint32 = {"_SM_"sv, 0x1E, 0x20, 5, 0x16, 2, 0x18, 4, true};
constexpr TEntryPointLayout kEntryPoint64 = {"_SM3_"sv, 0x18, 0x20, 6, 0x0C, 4, 0x10, 8, false};

bool IsInnerPartSound(std::string_view entryPoint) {
  std::string_view const inner = entryPoint.substr(0x10, 0x0F);
  return StartsWith(inner, "_DMI_"sv) && IsSumZero(inner);
}

// The table at `address` in the file, cut at the end of the file. Empty when `address` is inside the entry point or after the
// end of the file.
std::string_view TableAt(std::string_view file, std::uint64_t address, std::size_t entryPointLength, std::uint64_t size) {
  if (address < entryPointLength || address > file.size()) return {};
  return file.substr(address, size);
}

std::string_view TableNamedBy(TEntryPointLayout const& layout, std::string_view file) {
  if (file.size() < layout.fMaxLength) return {};  // no room for a table after it
  std::size_t const length = ByteAt(file, layout.fLengthOffset);
  if (length < layout.fMinLength || length > layout.fMaxLength) return {};
  if (!IsSumZero(file.substr(0, length))) return {};
  if (layout.fHasInnerPart && !IsInnerPartSound(file)) return {};

  std::uint64_t const address = NumberAt(file, layout.fTableAddressOffset, layout.fTableAddressBytes);
  return TableAt(file, address, length, NumberAt(file, layout.fTableSizeOffset, layout.fTableSizeBytes));
}

// The length of an entry point older than SMBIOS 2.1, which has no length byte.
constexpr std::size_t kLegacyLength = 0x0F;

bool BeginsWithLegacyEntryPoint(std::string_view file) {
  return StartsWith(file, "_DMI_"sv) && file.size() >= kLegacyLength && IsSumZero(file.substr(0, kLegacyLength));
}

std::string_view TableNamedByLegacy(std::string_view file) {
  return TableAt(file, NumberAt(file, 0x08, 4), kLegacyLength, NumberAt(file, 0x06, 2));
}

}  // namespace

int TypeOf(TStructure structure) { return static_cast<int>(ByteAt(structure, 0)); }

TStructure TStructureReader::Next() {
  TStructure const structure = FirstStructureOf(fRest);
  fRest.remove_prefix(structure.size());
  if (structure.empty() || TypeOf(structure) == kEndOfTableType) fRest = {};
  return structure;
}

TStructure TStructureReader::NextOfType(int type) {
  TStructure structure = Next();
  while (!structure.empty() && TypeOf(structure) != type) structure = Next();
  return structure;
}

std::string_view DmiTableIn(std::string_view file) {
  if (StartsWith(file, kEntryPoint64.fAnchor)) return TableNamedBy(kEntryPoint64, file);
  if (StartsWith(file, kEntryPoint32.fAnchor)) return TableNamedBy(kEntryPoint32, file);
  if (BeginsWithLegacyEntryPoint(file)) return TableNamedByLegacy(file);
  return file;
}

}  // namespace smbios
