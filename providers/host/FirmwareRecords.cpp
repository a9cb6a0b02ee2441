// SPDX-License-Identifier: Apache-2.0
#include "FirmwareRecords.h"

#include "BoardRecords.h"
#include "SmbiosFields.h"

#include <cstdio>

namespace NQRVZEP20 {

namespace {

using TTexts = TFinding<std::vector<std::string>>;

// ---- BIOS ----

constexpr char const* kCharacteristics[] = {"ISA is supported",
                                            "MCA is supported",
                                            "EISA is supported",
                                            "PCI is supported",
                                            "PC Card (PCMCIA) is supported",
                                            "PNP is supported",
                                            "APM is supported",
                                            "BIOS is upgradeable",
                                            "BIOS shadowing is allowed",
                                            "VLB is supported",
                                            "ESCD support is available",
                                            "Boot from CD is supported",
                                            "Selectable boot is supported",
                                            "BIOS ROM is socketed",
                                            "Boot from PC Card (PCMCIA) is supported",
                                            "EDD is supported"};  // from bit 4
constexpr char const* kExtended[] = {"ACPI is supported",
                                     "USB legacy is supported",
                                     "AGP is supported",
                                     "I2O boot is supported",
                                     "LS-120 boot is supported",
                                     "ATAPI Zip drive boot is supported",
                                     "IEEE 1394 boot is supported",
                                     "Smart battery is supported",
                                     "BIOS boot specification is supported",
                                     "Function key-initiated network boot is supported",
                                     "Targeted content distribution is supported",
                                     "UEFI is supported",
                                     "System is a virtual machine"};  // from bit 0 of two bytes

TTexts CharacteristicsOf(TSmbiosStructure const& bios) {
  constexpr std::uint64_t areNotSupported = 1 << 3;
  return bios.QWord(0x0a).Then([&](std::uint64_t bits) -> TTexts {
    auto words = bits & areNotSupported ? std::vector<std::string>() : WordsFor(bits, kCharacteristics, 4);
    if (auto const extended = bios.Word(0x12)) {
      auto const more = WordsFor(*extended, kExtended, 0);
      words.insert(words.end(), more.begin(), more.end());
    }
    if (words.empty()) return Unknown();
    return words;
  });
}

// "1.10", from two bytes; 255 stands for a system without such numbers.
TFinding<std::string> ReleaseAt(TSmbiosStructure const& bios, std::size_t offset) {
  constexpr std::uint8_t none = 0xff;
  return NumberOf<unsigned>(bios.Byte(offset), none).Then([&](unsigned major) {
    return NumberOf<unsigned>(bios.Byte(offset + 1), none).Then([major](unsigned minor) {
      return std::to_string(major) + "." + std::to_string(minor);
    });
  });
}

// In bytes. The first field counts 64 KiB from 1; the highest number refers to the second field, in MiB or GiB.
TFinding<std::uint64_t> RomSizeOf(TSmbiosStructure const& bios) {
  constexpr std::uint8_t seeExtended = 0xff;
  auto const size = bios.Byte(0x09);
  if (!IsNumber(size, seeExtended)) return size.Then([](std::uint64_t number) { return (number + 1) << 16; });
  return bios.Word(0x18).Then([](std::uint64_t field) { return (field & 0x3fff) << (field & 0x4000 ? 30 : 20); });
}

// ---- Chassis ----

TFinding<std::string> StateFrom(std::uint8_t state) {
  constexpr char const* words[] = {"Safe", "Warning", "Critical", "Non-recoverable"};  // from 3
  if (state == 1) return std::string("Other");
  if (state == 2) return Unknown();
  return WordFor(state, words, 3, "state of the chassis");
}

TFinding<std::string> SecurityFrom(std::uint8_t status) {
  constexpr char const* words[] = {"None", "External Interface Locked Out", "External Interface Enabled"};  // from 3
  if (status == 1) return std::string("Other");
  if (status == 2) return Unknown();
  return WordFor(status, words, 3, "security status of the chassis");
}

// ---- Memory module ----

constexpr char const* kTypeDetails[] = {
    "Fast-paged", "Static Column", "Pseudo-static", "RAMBus",       "Synchronous",           "CMOS",
    "EDO",        "Window DRAM",   "Cache DRAM",    "Non-Volatile", "Registered (Buffered)", "Unbuffered (Unregistered)",
    "LRDIMM"};  // from bit 3

TTexts TypeDetailsFrom(std::uint16_t bits) {
  auto words = WordsFor(bits, kTypeDetails, 3);
  if (words.empty()) return Unknown();
  return words;
}

TFinding<std::string> TechnologyFrom(std::uint8_t technology) {
  constexpr char const* words[] = {"DRAM",  "NVDIMM-N", "NVDIMM-F", "NVDIMM-P", "Intel Optane persistent memory",
                                   "MRDIMM"};  // from 3
  if (technology == 1) return std::string("Other");
  if (technology == 2) return Unknown();
  return WordFor(technology, words, 3, "memory technology");
}

TTexts OperatingModesFrom(std::uint16_t bits) {
  constexpr char const* words[] = {"Volatile memory", "Byte-accessible persistent memory",
                                   "Block-accessible persistent memory"};  // from bit 3
  auto found = WordsFor(bits, words, 3);
  if (found.empty()) return Unknown();
  return found;
}

// The number of a maker by JEDEC: the lower byte counts the banks before its own, the upper one is its code there.
TFinding<std::string> MakerAt(TSmbiosStructure const& memoryDevice, std::size_t offset) {
  return NumberOf<std::uint16_t>(memoryDevice.Word(offset), std::uint16_t(0)).Then([](std::uint16_t number) {
    char text[32];
    std::snprintf(text, sizeof text, "Bank %d, Hex 0x%02X", (number & 0x7f) + 1, number >> 8);
    return std::string(text);
  });
}

TFinding<std::uint16_t> ProductAt(TSmbiosStructure const& memoryDevice, std::size_t offset) {
  return NumberOf<std::uint16_t>(memoryDevice.Word(offset), std::uint16_t(0));
}

TFinding<std::uint64_t> SizeAt(TSmbiosStructure const& memoryDevice, std::size_t offset) {
  return NumberOf<std::uint64_t>(memoryDevice.QWord(offset), ~std::uint64_t(0));
}

TFinding<std::uint8_t> RankFrom(std::uint8_t attributes) {
  return NumberOf<std::uint8_t>(TFinding<std::uint8_t>(attributes & 0x0f), std::uint8_t(0));
}

TFinding<std::uint16_t> MillivoltsAt(TSmbiosStructure const& memoryDevice, std::size_t offset) {
  return NumberOf<std::uint16_t>(memoryDevice.Word(offset), std::uint16_t(0));
}

// ---- Processor ----

// Tenths of a volt, if the highest bit is set; otherwise the voltages that the socket offers.
TFinding<std::uint16_t> ProcessorMillivoltsFrom(std::uint8_t field) {
  constexpr std::uint8_t isCurrent = 0x80;
  if (field == 0) return Unknown();
  if (!(field & isCurrent))
    return TMissing{kMissingNotGiven, "the firmware reports only the voltages that the socket offers, not that of the processor"};
  return static_cast<std::uint16_t>((field & ~isCurrent) * 100);
}

// The record of settings with this identifier.
TRecord SettingsRecord(char const* className, std::string const& source, std::string const& id) {
  TRecord record(className, source, "CIM_SettingData");
  record.AddKey("InstanceID", id);
  record.AddOwn("ElementName", id);
  return record;
}

}  // namespace

TRecord FirmwareSettingsRecord(TSmbiosStructure const& bios, std::string const& source, unsigned number) {
  TRecord record = SettingsRecord("ZEP_FirmwareSettings", source, "BIOS " + std::to_string(number));
  record.Add("Release", ReleaseAt(bios, 0x14));
  record.Add("ControllerRelease", ReleaseAt(bios, 0x16));
  record.Add("ROMSize", RomSizeOf(bios)).Unit("byte");
  record.Add("Characteristics", CharacteristicsOf(bios));
  return record;
}

TRecord ChassisStateRecord(TSmbiosStructure const& chassis, std::string const& source, unsigned number) {
  TRecord record = SettingsRecord("ZEP_ChassisState", source, "Chassis " + std::to_string(number));
  record.Add("BootUpState", chassis.Byte(0x09).Then(StateFrom));
  record.Add("PowerSupplyState", chassis.Byte(0x0a).Then(StateFrom));
  record.Add("ThermalState", chassis.Byte(0x0b).Then(StateFrom));
  record.Add("SecurityStatus", chassis.Byte(0x0c).Then(SecurityFrom));
  return record;
}

TRecord ModuleSettingsRecord(TSmbiosStructure const& memoryDevice, TSmbiosStructure const& array, std::string const& source,
                             unsigned number) {
  TRecord record = SettingsRecord("ZEP_MemoryModuleSettings", source, "Memory device " + std::to_string(number));
  record.Add("TypeDetails", memoryDevice.Word(0x13).Then(TypeDetailsFrom));
  record.Add("Technology", memoryDevice.Byte(0x28).Then(TechnologyFrom));
  record.Add("OperatingModes", memoryDevice.Word(0x29).Then(OperatingModesFrom));
  record.Add("FirmwareVersion", TextOf(memoryDevice, 0x2b));
  record.Add("ModuleManufacturerID", MakerAt(memoryDevice, 0x2c));
  record.Add("ModuleProductID", ProductAt(memoryDevice, 0x2e));
  record.Add("ControllerManufacturerID", MakerAt(memoryDevice, 0x30));
  record.Add("ControllerProductID", ProductAt(memoryDevice, 0x32));
  record.Add("NonVolatileSize", SizeAt(memoryDevice, 0x34)).Unit("byte");
  record.Add("VolatileSize", SizeAt(memoryDevice, 0x3c)).Unit("byte");
  record.Add("CacheSize", SizeAt(memoryDevice, 0x44)).Unit("byte");
  record.Add("LogicalSize", SizeAt(memoryDevice, 0x4c)).Unit("byte");
  record.Add("Ranks", memoryDevice.Byte(0x1b).Then(RankFrom));
  record.Add("ErrorCorrection", ErrorCorrectionOf(array));
  record.Add("MinimumVoltage", MillivoltsAt(memoryDevice, 0x22)).Unit("volt * 10^-3");
  record.Add("MaximumVoltage", MillivoltsAt(memoryDevice, 0x24)).Unit("volt * 10^-3");
  record.Add("ConfiguredVoltage", MillivoltsAt(memoryDevice, 0x26)).Unit("volt * 10^-3");
  return record;
}

TRecord ProcessorChipRecord(TSmbiosStructure const& processor, std::string const& source, unsigned number) {
  TRecord record("ZEP_ProcessorChip", source, "CIM_Chip");
  record.AddKey("Tag", "Processor " + std::to_string(number));
  record.AddKey("CreationClassName", "ZEP_ProcessorChip");
  record.Add("ElementName", TextOf(processor, 0x04));
  record.Add("Manufacturer", TextOf(processor, 0x07));
  record.Add("Model", TextOf(processor, 0x10));
  record.Add("SerialNumber", TextOf(processor, 0x20));
  record.Add("UserTracking", TextOf(processor, 0x21));
  record.Add("PartNumber", TextOf(processor, 0x22));
  record.Add("Voltage", processor.Byte(0x11).Then(ProcessorMillivoltsFrom)).Unit("volt * 10^-3");
  return record;
}

}  // namespace NQRVZEP20
