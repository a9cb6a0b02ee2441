// SPDX-License-Identifier: Apache-2.0
#include "FirmwareRecords.h"

#include "BoardRecords.h"
#include "SmbiosFields.h"

namespace NQRVZEP20 {

namespace {

using TTexts = TFinding<std::vector<std::string>>;

// The words for the bits that are set, from bit `first` on.
template <class TBits, std::size_t N>
std::vector<std::string> WordsFor(TBits bits, char const* const (&words)[N], unsigned first) {
  std::vector<std::string> found;
  for (std::size_t at = 0; at < N; ++at)
    if (bits >> (first + at) & 1) found.emplace_back(words[at]);
  return found;
}

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
