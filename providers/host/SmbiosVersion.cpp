// SPDX-License-Identifier: Apache-2.0
#include "SmbiosVersion.h"

#include <algorithm>
#include <cerrno>
#include <filesystem>
#include <fstream>
#include <numeric>
#include <system_error>

namespace NQRVZEP20 {

namespace {

constexpr std::size_t kLongestEntryPoint = 0x20;
constexpr std::size_t kLegacyLength = 0x0F;

unsigned ByteAt(std::string_view bytes, std::size_t offset) { return static_cast<unsigned char>(bytes[offset]); }

bool StartsWith(std::string_view bytes, std::string_view start) { return bytes.substr(0, start.size()) == start; }

// The sum of the bytes of a valid entry point is 0.
bool IsSumZero(std::string_view bytes) {
  return std::accumulate(bytes.begin(), bytes.end(), 0u,
                         [](unsigned sum, char byte) { return (sum + static_cast<unsigned char>(byte)) & 0xFFu; }) == 0;
}

// `least`: the smallest valid length.
bool IsSound(std::string_view bytes, std::size_t lengthOffset, std::size_t least) {
  if (bytes.size() <= lengthOffset) return false;
  std::size_t const length = ByteAt(bytes, lengthOffset);
  return length >= least && length <= kLongestEntryPoint && length <= bytes.size() && IsSumZero(bytes.substr(0, length));
}

// Some firmware has versions that do not exist: 2.31 and 2.33 mean 2.3, 2.51 means 2.6.
TSmbiosVersion Corrected(TSmbiosVersion version) {
  if (version == TSmbiosVersion(2, 31) || version == TSmbiosVersion(2, 33)) return {2, 3};
  if (version == TSmbiosVersion(2, 51)) return {2, 6};
  return version;
}

// The start of a file. Empty when the file does not exist or is not a regular file: reading a pipe could block.
TFinding<std::string> StartOf(std::filesystem::path const& path) {
  std::error_code ignored;
  if (!std::filesystem::is_regular_file(path, ignored)) return std::string();
  errno = 0;
  std::ifstream file(path, std::ios::binary);
  std::string start(kLongestEntryPoint, '\0');
  file.read(start.data(), static_cast<std::streamsize>(start.size()));
  if (!file.is_open() || file.bad())
    return TMissing{kMissingUnreadable, path.string() + " cannot be read: " + std::generic_category().message(errno)};
  start.resize(static_cast<std::size_t>(file.gcount()));
  return start;
}

}  // namespace

std::optional<TSmbiosVersion> VersionInEntryPoint(std::string_view bytes) {
  if (StartsWith(bytes, "_SM3_") && IsSound(bytes, 6, 0x18)) return TSmbiosVersion(ByteAt(bytes, 7), ByteAt(bytes, 8));
  if (StartsWith(bytes, "_SM_") && IsSound(bytes, 5, 0x1E)) return Corrected({ByteAt(bytes, 6), ByteAt(bytes, 7)});
  bool const isLegacy = StartsWith(bytes, "_DMI_") && bytes.size() >= kLegacyLength && IsSumZero(bytes.substr(0, kLegacyLength));
  if (isLegacy) return TSmbiosVersion(ByteAt(bytes, 0x0E) >> 4, ByteAt(bytes, 0x0E) & 0x0F);
  return std::nullopt;
}

TFinding<std::optional<TSmbiosVersion>> VersionOfTables(std::string const& tableFile) {
  auto const inDump = StartOf(tableFile).Then(VersionInEntryPoint);
  if (!inDump || *inDump) return inDump;
  return StartOf(std::filesystem::path(tableFile).replace_filename("smbios_entry_point")).Then(VersionInEntryPoint);
}

}  // namespace NQRVZEP20
