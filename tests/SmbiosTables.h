// SPDX-License-Identifier: Apache-2.0
#pragma once

// SMBIOS tables for tests: the real tables of tests/data/smbios, and functions that build others.

#include "tests/Support.h"

#include <cstdio>
#include <stdexcept>
#include <string>
#include <vector>

namespace NQRVZEP20 {

using namespace std::string_literals;

// The directories below tests/data/smbios. Each holds the tables that the kernel of a virtual machine with chosen strings
// exported.
inline std::vector<std::string> const kRealTables = {"full", "bare7", "eight", "no-serial", "two-dashes", "qemu-own", "entry64"};

inline std::string RealTablePath(std::string const& name) { return TestDataPath("smbios/" + name + "/DMI"); }

inline std::string RealTable(std::string const& name) { return ReadFile(RealTablePath(name)); }

// The invented server that is bundled with the front end, in the format of `dmidecode --dump-bin`.
inline std::string SamplePath() { return SourcePath("tools/zep/sample/smbios.bin"); }

inline std::string LittleEndian(unsigned long long number, int bytes) {
  std::string text;
  for (; bytes > 0; --bytes, number >>= 8) text.push_back(static_cast<char>(number & 0xFF));
  return text;
}

// A structure with these fields after its header, and these strings. Without strings, the string set is two zero bytes.
inline std::string Structure(int type, std::string const& fields, std::vector<std::string> const& strings = {}) {
  std::string structure = LittleEndian(type, 1) + LittleEndian(4 + fields.size(), 1) + LittleEndian(type, 2) + fields;
  for (std::string const& text : strings) structure += text + '\0';
  return structure + std::string(strings.empty() ? 2 : 1, '\0');
}

inline std::string EndOfTable() { return Structure(127, ""); }

// A structure of type 1 whose product name is string 1 and whose serial number is string 2.
inline std::string SystemInformation(std::string const& productName, std::string const& serialNumber) {
  return Structure(1, "\0\1\0\2"s + std::string(19, '\0'), {productName, serialNumber});
}

// A structure of type 0 whose version is string 2.
inline std::string BiosInformation(std::string const& version) {
  return Structure(0, "\1\2"s + std::string(18, '\0'), {"Example Works", version});
}

inline std::string WithCheckSum(std::string entryPoint, std::size_t offset, std::size_t from, std::size_t size) {
  unsigned sum = 0;
  entryPoint[offset] = 0;
  for (char byte : entryPoint.substr(from, size)) sum += static_cast<unsigned char>(byte);
  entryPoint[offset] = static_cast<char>(-sum);
  return entryPoint;
}

inline std::string Version(int version) { return LittleEndian(version >> 8, 1) + LittleEndian(version & 0xFF, 1); }

// Entry points as `dmidecode --dump-bin` writes them before a table, padded to 32 bytes. The high byte of `version` is the major
// number, the low byte the minor: 0x208 means 2.8.
inline std::string EntryPoint32(std::size_t tableSize, std::size_t tableAddress = 32, int length = 0x1F, int version = 0x208) {
  std::string const inner = "_DMI_\0"s + LittleEndian(tableSize, 2) + LittleEndian(tableAddress, 4) + "\0\0\x28\0"s;
  std::string entry = "_SM_\0"s + LittleEndian(length, 1) + Version(version) + std::string(8, '\0') + inner;
  entry.resize(32);
  return WithCheckSum(WithCheckSum(entry, 0x15, 0x10, 0x0F), 4, 0, length);
}

inline std::string EntryPoint64(std::size_t tableSize, unsigned long long tableAddress = 32, int length = 0x18,
                                int version = 0x303) {
  std::string entry = "_SM3_\0"s + LittleEndian(length, 1) + Version(version) + "\0\1\0"s + LittleEndian(tableSize, 4) +
                      LittleEndian(tableAddress, 8);
  entry.resize(32);
  return WithCheckSum(entry, 5, 0, length);
}

// The entry point of tables older than SMBIOS 2.1. Its version is one byte: 0x20 means 2.0.
inline std::string EntryPointLegacy(std::size_t tableSize, std::size_t tableAddress = 32, int version = 0x20) {
  std::string entry =
      "_DMI_\0"s + LittleEndian(tableSize, 2) + LittleEndian(tableAddress, 4) + "\0\0"s + LittleEndian(version, 1);
  entry.resize(32);
  return WithCheckSum(entry, 5, 0, 0x0F);
}

// Returns the command's standard output.
inline std::string OutputOfCommand(std::string const& command) {
  std::string output;
  FILE* const pipe = ::popen(command.c_str(), "r");
  if (pipe == nullptr) throw std::runtime_error("cannot run " + command);
  char chunk[4096];
  while (std::size_t const got = std::fread(chunk, 1, sizeof chunk, pipe)) output.append(chunk, got);
  ::pclose(pipe);
  return output;
}

}  // namespace NQRVZEP20
