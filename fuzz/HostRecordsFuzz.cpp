// SPDX-License-Identifier: Apache-2.0

// Reads any bytes as an SMBIOS structure of every type that the host provider knows. Each record must have its number of
// properties, and each property a value or a reason. The same bytes are also read as an SMBIOS entry point.

#include "fuzz/Require.h"
#include "providers/host/SmbiosRecords.h"

namespace NQRVZEP20 {

namespace {

void RequireWhole(TRecord const& record, std::size_t properties) {
  Require(record.GetProperties().size() == properties);
  for (TRecordProperty const& property : record.GetProperties())
    Require(!property.fValue.IsNull() || (!property.fMissing.fCode.empty() && !property.fMissing.fReason.empty()));
}

void ReadAsEveryRecord(TSmbiosStructure const& structure) {
  TSystemName const name{"fuzz", "fuzz"};
  RequireWhole(ComputerSystemRecord(structure, "", name), 9);
  RequireWhole(BiosRecord(structure, "", 0), 9);
  RequireWhole(ChassisRecord(structure, "", 0), 12);
  RequireWhole(ProcessorRecord(structure, "", 0, name), 16);
  RequireWhole(MemoryRecord(structure, "", 0), 16);
  static_cast<void>(IsSocketFilled(structure));
  static_cast<void>(IsSlotFilled(structure));
}

}  // namespace

}  // namespace NQRVZEP20

extern "C" int LLVMFuzzerTestOneInput(std::uint8_t const* data, std::size_t size) {
  static_cast<void>(NQRVZEP20::VersionInEntryPoint({reinterpret_cast<char const*>(data), size}));
  NQRVZEP20::ReadAsEveryRecord(NQRVZEP20::TSmbiosStructure(std::vector<unsigned char>(data, data + size)));
  return 0;
}
