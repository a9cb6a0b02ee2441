// SPDX-License-Identifier: Apache-2.0
#include "providers/host/FirmwareRecords.h"

#include "tests/providers/host/Structures.h"

#include <gtest/gtest.h>

namespace NQRVZEP20 {
namespace {

constexpr char const* kUnknownText = "string NULL not-given: the firmware reports it as unknown";

struct TExpected {
  char const *fProperty, *fValue;
};

void ExpectProperties(TRecord const& record, std::vector<TExpected> const& expected) {
  for (auto const& [property, value] : expected) EXPECT_EQ(PropertyOf(record, property), value) << property;
}

TEST(FirmwareRecordsTest, TheReleaseAndTheSizeOfTheFirmwareAreRead) {
  TStructureMaker const maker = TStructureMaker(0, 0x1a).Byte(0x14, 1).Byte(0x15, 10).Byte(0x16, 0xff).Byte(0x17, 0xff);
  TStructureMaker small = maker;
  small.Byte(0x09, 0xff).Word(0x18, 32).DWord(0x0a, 0x00000880).Word(0x12, 0x0801);
  ExpectProperties(
      FirmwareSettingsRecord(small.Make(), "SMBIOS type 0", 0),
      {{"InstanceID", "string BIOS 0"},
       {"Release", "string 1.10"},
       {"ControllerRelease", kUnknownText},
       {"ROMSize", "uint64 33554432"},
       {"Characteristics", "string { PCI is supported, BIOS is upgradeable, ACPI is supported, UEFI is supported }"}});
  TStructureMaker large = maker;
  EXPECT_EQ(PropertyOf(FirmwareSettingsRecord(large.Byte(0x09, 3).Make(), "", 0), "ROMSize"), "uint64 262144");
  EXPECT_EQ(PropertyOf(FirmwareSettingsRecord(large.Byte(0x09, 0xff).Word(0x18, 0x4002).Make(), "", 0), "ROMSize"),
            "uint64 2147483648");
}

TEST(FirmwareRecordsTest, WithoutCharacteristicsOnlyTheExtendedOnesAreListed) {
  TStructureMaker maker(0, 0x1a);
  maker.DWord(0x0a, 0xfffffff8).Word(0x12, 0x1000);
  EXPECT_EQ(PropertyOf(FirmwareSettingsRecord(maker.Make(), "", 0), "Characteristics"), "string { System is a virtual machine }");
  EXPECT_EQ(PropertyOf(FirmwareSettingsRecord(maker.Word(0x12, 0).Make(), "", 0), "Characteristics"),
            "string NULL not-given: the firmware reports it as unknown");
}

TEST(FirmwareRecordsTest, TheStatesOfAChassisAreWords) {
  TStructureMaker maker(3, 0x15);
  maker.Byte(0x09, 3).Byte(0x0a, 4).Byte(0x0b, 2).Byte(0x0c, 9);
  ExpectProperties(
      ChassisStateRecord(maker.Make(), "SMBIOS type 3", 1),
      {{"InstanceID", "string Chassis 1"},
       {"BootUpState", "string Safe"},
       {"PowerSupplyState", "string Warning"},
       {"ThermalState", kUnknownText},
       {"SecurityStatus", "string NULL unexpected-form: not in the expected form: security status of the chassis 9"}});
}

TEST(FirmwareRecordsTest, AModuleHasTheErrorCorrectionOfItsArray) {
  TStructureMaker maker(17, 0x54);
  maker.Word(0x13, 0x2080).Byte(0x1b, 0xf2).Word(0x22, 1140).Word(0x24, 0).Word(0x26, 1200).Byte(0x28, 3);
  ExpectProperties(ModuleSettingsRecord(maker.Make(), TStructureMaker(16, 0x17).Byte(0x06, 5).Make(), "SMBIOS type 17", 3),
                   {{"InstanceID", "string Memory device 3"},
                    {"TypeDetails", "string { Synchronous, Registered (Buffered) }"},
                    {"Technology", "string DRAM"},
                    {"Ranks", "uint8 2"},
                    {"ErrorCorrection", "string Single-bit ECC"},
                    {"MinimumVoltage", "uint16 1140"},
                    {"MaximumVoltage", "uint16 NULL not-given: the firmware reports it as unknown"},
                    {"ConfiguredVoltage", "uint16 1200"}});
  TRecord const old = ModuleSettingsRecord(TStructureMaker(17, 0x15).Make(), TSmbiosStructure(TMissing{"code", "why"}), "", 0);
  EXPECT_EQ(PropertyOf(old, "Ranks"), "uint8 NULL not-given: the firmware's structure ends before this field");
  EXPECT_EQ(PropertyOf(old, "ErrorCorrection"), "string NULL code: why");
}

TEST(FirmwareRecordsTest, AModuleThatKeepsItsContentsHasItsSizesAndMakers) {
  TStructureMaker maker(17, 0x5c);
  maker.Byte(0x28, 4).Word(0x29, 0x18).Text(0x2b, "NV 1.2").Word(0x2c, 0x2c83).Word(0x2e, 0x4410).DWord(0x34, 1 << 30);
  maker.Bytes(0x3c, std::string(8, '\xff'));
  ExpectProperties(ModuleSettingsRecord(maker.Make(), TStructureMaker(16, 0x17).Make(), "SMBIOS type 17", 0),
                   {{"Technology", "string NVDIMM-N"},
                    {"OperatingModes", "string { Volatile memory, Byte-accessible persistent memory }"},
                    {"FirmwareVersion", "string NV 1.2"},
                    {"ModuleManufacturerID", "string Bank 4, Hex 0x2C"},
                    {"ModuleProductID", "uint16 17424"},
                    {"ControllerManufacturerID", kUnknownText},
                    {"ControllerProductID", "uint16 NULL not-given: the firmware reports it as unknown"},
                    {"NonVolatileSize", "uint64 1073741824"},
                    {"VolatileSize", "uint64 NULL not-given: the firmware reports it as unknown"},
                    {"CacheSize", "uint64 0"}});
}

TEST(FirmwareRecordsTest, AProcessorIsAChipWithNumbersOfItsMaker) {
  TStructureMaker maker(4, 0x30);
  maker.Text(0x04, "CPU 1").Text(0x07, "Example Works").Text(0x10, "Processor 44").Byte(0x11, 0x8c);
  maker.Text(0x20, "PS1").Text(0x21, "Asset").Text(0x22, "To be filled by O.E.M.");
  ExpectProperties(ProcessorChipRecord(maker.Make(), "SMBIOS type 4", 1),
                   {{"Tag", "string Processor 1"},
                    {"ElementName", "string CPU 1"},
                    {"Manufacturer", "string Example Works"},
                    {"Model", "string Processor 44"},
                    {"SerialNumber", "string PS1"},
                    {"UserTracking", "string Asset"},
                    {"PartNumber", "string NULL placeholder: placeholder text of the firmware: \"To be filled by O.E.M.\""},
                    {"Voltage", "uint16 1200"}});
  EXPECT_EQ(PropertyOf(ProcessorChipRecord(maker.Byte(0x11, 0x02).Make(), "", 0), "Voltage"),
            "uint16 NULL not-given: the firmware reports only the voltages that the socket offers, not that of the processor");
}

}  // namespace
}  // namespace NQRVZEP20
