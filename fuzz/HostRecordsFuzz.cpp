// SPDX-License-Identifier: Apache-2.0

// Reads any bytes as an SMBIOS structure of every type that the host provider knows. Each record must have the same properties as
// the record of an empty structure, and each property a value or a reason. The same bytes are also read as an SMBIOS entry point.

#include "fuzz/Require.h"
#include "providers/host/BoardRecords.h"
#include "providers/host/FirmwareRecords.h"
#include "providers/host/ProcessorRecords.h"
#include "providers/host/SmbiosRecords.h"
#include "providers/host/SmbiosVersion.h"

namespace NQRVZEP20 {

namespace {

template <class TMakeRecord>
void RequireWhole(TSmbiosStructure const& structure, TMakeRecord const& makeRecord) {
  TRecord const record = makeRecord(structure);
  Require(record.GetProperties().size() == makeRecord(TSmbiosStructure(std::vector<unsigned char>())).GetProperties().size());
  for (TRecordProperty const& property : record.GetProperties())
    Require(!property.fValue.IsNull() || (!property.fMissing.fCode.empty() && !property.fMissing.fReason.empty()));
}

void ReadAsEveryRecord(TSmbiosStructure const& structure) {
  TSystemName const name{"fuzz", "fuzz"};
  RequireWhole(structure, [&](auto const& bytes) { return ComputerSystemRecord(bytes, "", name); });
  RequireWhole(structure, [](auto const& bytes) { return BiosRecord(bytes, "", 0); });
  RequireWhole(structure, [](auto const& bytes) { return ChassisRecord(bytes, "", 0); });
  RequireWhole(structure, [&](auto const& bytes) {
    return ProcessorRecord(bytes, "", 0, name, TMissing{kMissingNotGiven, "no kernel"});
  });
  RequireWhole(structure, [](auto const& bytes) { return MemoryRecord(bytes, "", 0); });
  RequireWhole(structure, [](auto const& bytes) { return BoardRecord(bytes, "", 0); });
  RequireWhole(structure, [](auto const& bytes) { return SlotRecord(bytes, "", 0); });
  RequireWhole(structure, [](auto const& bytes) { return MemoryArrayRecord(bytes, "", 0); });
  RequireWhole(structure, [](auto const& bytes) { return OnboardDeviceRecord(bytes, "", 0); });
  RequireWhole(structure, [&](auto const& bytes) { return IpmiRecord(bytes, "", 0, name); });
  RequireWhole(structure, [](auto const& bytes) { return FirmwareSettingsRecord(bytes, "", 0); });
  RequireWhole(structure, [](auto const& bytes) { return ChassisStateRecord(bytes, "", 0); });
  RequireWhole(structure, [](auto const& bytes) { return ModuleSettingsRecord(bytes, bytes, "", 0); });
  RequireWhole(structure, [](auto const& bytes) { return ProcessorChipRecord(bytes, "", 0); });
  static_cast<void>(IsSocketFilled(structure));
  static_cast<void>(IsSlotFilled(structure));
  static_cast<void>(HandlesOn(structure));
}

}  // namespace

}  // namespace NQRVZEP20

extern "C" int LLVMFuzzerTestOneInput(std::uint8_t const* data, std::size_t size) {
  static_cast<void>(NQRVZEP20::VersionInEntryPoint({reinterpret_cast<char const*>(data), size}));
  NQRVZEP20::ReadAsEveryRecord(NQRVZEP20::TSmbiosStructure(std::vector<unsigned char>(data, data + size)));
  return 0;
}
