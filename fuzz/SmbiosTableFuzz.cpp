// SPDX-License-Identifier: Apache-2.0

// Reads any bytes as an SMBIOS table: with the parser, with the C functions of libsmbios.so on a file in memory, and with
// the core's readers of structures. Every structure must be complete and inside the table.

#include "TOSSpecific.h"
#include "fuzz/Require.h"
#include "os/MachineIdentity.h"
#include "platform/include/smbios.h"
#include "platform/smbios/SmbiosTable.h"

#include <stdlib.h>
#include <sys/mman.h>
#include <unistd.h>

#include <algorithm>
#include <array>
#include <cstdint>
#include <string>
#include <vector>

namespace {

using namespace NQRVZEP20;

using TCounts = std::array<int, 256>;  // structures by type

// Counts the structures. Each must be complete and directly follow the one before.
TCounts CountsInTable(std::string_view file) {
  std::string_view const table = smbios::DmiTableIn(file);
  smbios::TStructureReader reader(table);
  char const* end = table.data();
  TCounts counts = {};
  for (smbios::TStructure structure = reader.Next(); !structure.empty(); structure = reader.Next()) {
    Require(structure.data() == end && structure.size() >= 6);
    end += structure.size();
    Require(end <= table.data() + table.size());
    Require(end[-1] == '\0' && end[-2] == '\0');
    ++counts[static_cast<std::size_t>(smbios::TypeOf(structure))];
  }
  return counts;
}

void ReadIdentity(std::string_view structure) {
  TStructureStrings const strings(structure);
  TMachineIdentity identity;
  ReadProductDescription(strings.NamedAt(5).value_or(""), identity);
  Require(identity.fType.size() == 4);
  Require(identity.fModel.size() == 3 || identity.fModel == "Unknown");
}

void ReadBiosVersion(std::string_view structure) {
  if (structure.size() < 6) return;
  std::string set(structure.substr(4));
  std::vector<char> output(set.size() + 1);
  int const found = TOSSpecific::getBIDString(set.data(), output.data(), static_cast<int>(set.size()), structure[5]);
  Require(found == 0 || found == 1);
  CleanBiosVersion(output.data());
}

// A file in memory that the library can open by name.
class TMemoryFile {
public:
  TMemoryFile() : fFd(::memfd_create("smbios", 0)) {
    Require(fFd >= 0);
    ::setenv("ZEP_SMBIOS_TABLE", ("/proc/self/fd/" + std::to_string(fFd)).c_str(), 1);
  }
  void Hold(std::string_view bytes) {
    Require(::ftruncate(fFd, 0) == 0);
    Require(::pwrite(fFd, bytes.data(), bytes.size(), 0) == static_cast<ssize_t>(bytes.size()));
  }

private:
  int fFd;
};

// Reads all structures of a type with the C functions, and their texts with the core's readers; returns the number of
// structures.
int CountOfType(void* handle, int type) {
  int count = 0;
  char buffer[1024] = {};
  int length = sizeof buffer;
  int status = smBiosGetFirst(handle, type, buffer, &length);
  for (; status == kSmbiosOk; status = smBiosGetNext(handle, type, buffer, &length)) {
    ++count;
    std::string_view const structure(buffer, static_cast<std::size_t>(std::min<int>(length, sizeof buffer)));
    ReadIdentity(structure);
    ReadBiosVersion(structure);
    length = sizeof buffer;
  }
  Require(status == kSmbiosNoMoreItems);
  return count;
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(std::uint8_t const* data, std::size_t size) {
  std::string_view const bytes(reinterpret_cast<char const*>(data), size);
  static TMemoryFile file;
  file.Hold(bytes);
  TCounts const counts = CountsInTable(bytes);
  void* handle = nullptr;
  int const status = smBiosLoad(nullptr, &handle);
  Require((status == kSmbiosOk) == !smbios::DmiTableIn(bytes).empty() && (status == kSmbiosOk) == (handle != nullptr));
  for (int type : {0, 1, 2, 127, 255})
    if (handle != nullptr) Require(CountOfType(handle, type) == counts[static_cast<std::size_t>(type)]);
  Require(smBiosClose(handle) == kSmbiosOk);
  ReadIdentity(bytes);
  ReadBiosVersion(bytes);
  return 0;
}
