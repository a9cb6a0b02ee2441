// SPDX-License-Identifier: Apache-2.0
#include "BoardRecords.h"

#include "PciPlace.h"
#include "SmbiosFields.h"
#include "ValueNames.h"

namespace NQRVZEP20 {

namespace {

// ---- Board ----

constexpr char const* kBoardTypes[] = {"Server Blade",        "Connectivity Switch", "System Management Module",
                                       "Processor Module",    "I/O Module",          "Memory Module",
                                       "Daughter Board",      "Motherboard",         "Processor/Memory Module",
                                       "Processor/IO Module", "Interconnect Board"};  // from 3

TFinding<std::string> BoardTypeFrom(std::uint8_t type) {
  if (type == 1) return std::string("Other");
  if (type == 2) return Unknown();
  return WordFor(type, kBoardTypes, 3, "board type");
}

TFinding<bool> FlagOf(TFinding<std::uint8_t> const& flags, unsigned bit) {
  return flags.Then([bit](std::uint8_t field) { return (field >> bit & 1) != 0; });
}

// The bits for removable, replaceable and hot-swappable.
TFinding<std::uint16_t> RemovalFrom(std::uint8_t features) {
  constexpr std::uint16_t notApplicable = 2, whenOff = 3, whenOnOrOff = 4;
  if (features & 0x10) return whenOnOrOff;
  return features & 0x0c ? whenOff : notApplicable;
}

// The bits for 5 and 3.3 volts, as numbers of CIM.
TFinding<std::vector<unsigned short>> SlotVoltagesFrom(std::uint8_t characteristics) {
  constexpr unsigned short at3Volts = 2, at5Volts = 3;
  std::vector<unsigned short> voltages;
  if (characteristics & 0x04) voltages.push_back(at3Volts);
  if (characteristics & 0x02) voltages.push_back(at5Volts);
  if (voltages.empty()) return Unknown();
  return voltages;
}

// ---- Memory array ----

constexpr char const* kLocations[] = {"system board", "ISA card",    "EISA card",        "PCI card",
                                      "MCA card",     "PCMCIA card", "proprietary card", "NuBus card"};  // from 3
constexpr char const* kUses[] = {"System memory", "Video memory", "Flash memory", "Non-volatile memory",
                                 "Cache memory"};                                                          // from 3
constexpr char const* kErrorCorrections[] = {"None", "Parity", "Single-bit ECC", "Multi-bit ECC", "CRC"};  // from 3

TFinding<std::string> ErrorCorrectionFrom(std::uint8_t type) {
  if (type == 1) return std::string("Other");
  if (type == 2) return Unknown();
  return WordFor(type, kErrorCorrections, 3, "kind of error correction");
}

// "System memory on the system board, 8 slots".
TFinding<std::string> DescriptionOf(TSmbiosStructure const& array) {
  auto const use = array.Byte(0x05).Then([](std::uint8_t number) { return WordFor(number, kUses, 3, "memory use"); });
  auto const place = array.Byte(0x04).Then([](std::uint8_t number) { return WordFor(number, kLocations, 3, "memory location"); });
  auto const slots = array.Word(0x0d);
  if (!use) return use;
  return *use + (place ? " on the " + *place : "") +
         (slots ? ", " + std::to_string(*slots) + (*slots == 1 ? " slot" : " slots") : "");
}

// In kilobytes. The first field refers to a wider one in bytes, if its highest bit alone is set.
TFinding<std::uint64_t> MaximumOf(TSmbiosStructure const& array) {
  constexpr std::uint32_t seeExtended = 0x80000000;
  auto const kilobytes = array.DWord(0x07);
  if (!IsNumber(kilobytes, seeExtended)) return NumberOf<std::uint64_t>(kilobytes, std::uint32_t(0));
  return array.QWord(0x0f).Then([](std::uint64_t bytes) { return bytes >> 10; });
}

// ---- IPMI ----

constexpr char const* kIpmiTypes[] = {"KCS", "SMIC", "BT", "SSIF"};  // from 1

TFinding<std::string> IpmiTypeFrom(std::uint8_t type) {
  if (type == 0) return Unknown();
  return WordFor(type, kIpmiTypes, 1, "IPMI interface type");
}

// Two digits in one byte: 0x20 is "2.0".
std::string IpmiVersionFrom(std::uint8_t version) { return std::to_string(version >> 4) + "." + std::to_string(version & 0x0f); }

// Without the lowest bit, which distinguishes ports from memory, and with the one that the modifier has instead.
TFinding<std::uint64_t> IpmiAddressOf(TSmbiosStructure const& interface) {
  return interface.QWord(0x08).Then([&](std::uint64_t address) -> TFinding<std::uint64_t> {
    if (address == 0) return Unknown();
    auto const modifier = interface.Byte(0x10);
    return (address & ~std::uint64_t(1)) | (modifier && *modifier & 0x10 ? 1 : 0);
  });
}

TFinding<bool> IsMemoryMapped(TSmbiosStructure const& interface) {
  return interface.QWord(0x08).Then([](std::uint64_t address) -> TFinding<bool> {
    if (address == 0) return Unknown();
    return (address & 1) == 0;
  });
}

TFinding<std::uint8_t> RegisterSpacingFrom(std::uint8_t modifier) {
  constexpr std::uint8_t bytes[] = {1, 4, 16};
  if (modifier >> 6 > 2) return NotOfTheForm("register spacing 3");
  return bytes[modifier >> 6];
}

// The bit of the modifier as a word; missing when the firmware does not describe the interrupt.
TFinding<std::string> InterruptWord(TSmbiosStructure const& interface, std::uint8_t bit, char const* set, char const* clear) {
  constexpr std::uint8_t isDescribed = 0x08;
  return interface.Byte(0x10).Then([=](std::uint8_t modifier) -> TFinding<std::string> {
    if (!(modifier & isDescribed)) return TMissing{kMissingNotGiven, "the firmware does not describe the interrupt"};
    return std::string(modifier & bit ? set : clear);
  });
}

// ---- Onboard device ----

constexpr char const* kDeviceTypes[] = {
    "Video",          "SCSI Controller", "Ethernet",  "Token Ring", "Sound", "PATA Controller", "SATA Controller",
    "SAS Controller", "Wireless LAN",    "Bluetooth", "WWAN",       "eMMC",  "NVMe Controller", "UFS Controller"};  // from 3

constexpr std::uint8_t kIsEnabled = 0x80;

TFinding<std::string> DeviceTypeFrom(std::uint8_t field) {
  std::uint8_t const type = field & ~kIsEnabled;
  if (type == 1) return std::string("Other");
  if (type == 2) return Unknown();
  return WordFor(type, kDeviceTypes, 3, "type of onboard device");
}

}  // namespace

TRecord BoardRecord(TSmbiosStructure const& board, std::string const& source, unsigned number) {
  TRecord record("CIM_Card", source);
  record.AddKey("Tag", "Board " + std::to_string(number));
  record.AddKey("CreationClassName", "CIM_Card");
  record.Add("Manufacturer", TextOf(board, 0x04));
  record.Add("Model", TextOf(board, 0x05));
  record.Add("Version", TextOf(board, 0x06));
  record.Add("SerialNumber", TextOf(board, 0x07));
  record.Add("UserTracking", TextOf(board, 0x08));
  record.Add("HostingBoard", FlagOf(board.Byte(0x09), 0));
  record.Add("RequiresDaughterBoard", FlagOf(board.Byte(0x09), 1));
  record.Add("RemovalConditions", board.Byte(0x09).Then(RemovalFrom)).Names(kRemovalConditionsNames);
  record.Add("Description", board.Byte(0x0d).Then(BoardTypeFrom));
  return record;
}

TRecord SlotRecord(TSmbiosStructure const& slot, std::string const& source, unsigned number) {
  TRecord record("CIM_Slot", source);
  record.AddKey("Tag", "Slot " + std::to_string(number));
  record.AddKey("CreationClassName", "CIM_Slot");
  record.Add("ElementName", TextOf(slot, 0x04));
  record.Add("Number", slot.Word(0x09));
  record.Add("ConnectorDescription", SlotTypeOf(slot));
  record.Add("MaxDataWidth", SlotDataWidthOf(slot)).Unit("bit");
  record.Add("MaxLinkWidth", SlotLinkWidthOf(slot)).Names(kMaxLinkWidthNames);
  record.Add("Description", SlotUsageOf(slot));
  record.Add("VccMixedVoltageSupport", slot.Byte(0x0b).Then(SlotVoltagesFrom)).Names(kSlotVoltageNames);
  record.Add("SupportsHotPlug", FlagOf(slot.Byte(0x0c), 1));
  record.Add("OtherIdentifyingInfo", PciAddressOf(slot, 0x0d));
  return record;
}

TRecord MemoryArrayRecord(TSmbiosStructure const& array, std::string const& source, unsigned number) {
  constexpr unsigned short unknownType = 0;
  TRecord record("CIM_MemoryCapacity", source);
  record.AddKey("Name", "Memory array " + std::to_string(number));
  record.AddKey("MemoryType", unknownType).Names(kArrayMemoryTypeNames);
  record.Add("ElementName", DescriptionOf(array));
  record.Add("Description", ErrorCorrectionOf(array).Then([](std::string const& kind) { return "Error correction: " + kind; }));
  record.Add("MaximumMemoryCapacity", MaximumOf(array)).Unit("byte * 2^10");
  return record;
}

TRecord OnboardDeviceRecord(TSmbiosStructure const& device, std::string const& source, unsigned number) {
  TRecord record("ZEP_OnboardDevice", source, "CIM_PhysicalComponent");
  record.AddKey("Tag", "Onboard device " + std::to_string(number));
  record.AddKey("CreationClassName", "ZEP_OnboardDevice");
  record.Add("ElementName", TextOf(device, 0x04));
  record.Add("DeviceType", device.Byte(0x05).Then(DeviceTypeFrom));
  record.Add("IsEnabled", device.Byte(0x05).Then([](std::uint8_t field) { return (field & kIsEnabled) != 0; }));
  record.Add("TypeInstance", device.Byte(0x06));
  record.Add("BusAddress", PciAddressOf(device, 0x07));
  return record;
}

TRecord IpmiRecord(TSmbiosStructure const& interface, std::string const& source, unsigned number, TSystemName const& name) {
  TRecord record("ZEP_IPMIInterface", source, "CIM_LogicalDevice");
  record.AddKey("SystemCreationClassName", "QRVSG_ComputerSystem");
  record.AddPropagatedKey("SystemName", name.fName);
  record.AddKey("CreationClassName", "ZEP_IPMIInterface");
  record.AddKey("DeviceID", "IPMI interface " + std::to_string(number));
  record.Add("InterfaceType", interface.Byte(0x04).Then(IpmiTypeFrom));
  record.Add("SpecificationVersion", interface.Byte(0x05).Then(IpmiVersionFrom));
  record.Add("I2CSlaveAddress", interface.Byte(0x06));
  record.Add("BaseAddress", IpmiAddressOf(interface));
  record.Add("IsMemoryMapped", IsMemoryMapped(interface));
  record.Add("RegisterSpacing", interface.Byte(0x10).Then(RegisterSpacingFrom)).Unit("byte");
  record.Add("InterruptNumber", NumberOf<std::uint8_t>(interface.Byte(0x11), std::uint8_t(0)));
  record.Add("InterruptPolarity", InterruptWord(interface, 0x02, "Active High", "Active Low"));
  record.Add("InterruptTrigger", InterruptWord(interface, 0x01, "Level", "Edge"));
  record.Add("NVStorageAddress", NumberOf<std::uint8_t>(interface.Byte(0x07), std::uint8_t(0xff)));
  return record;
}

std::vector<std::uint16_t> HandlesOn(TSmbiosStructure const& board) {
  std::vector<std::uint16_t> handles;
  auto const count = board.Byte(0x0e);
  for (unsigned at = 0; count && at < *count; ++at)
    if (auto const handle = board.Word(0x0f + 2 * at)) handles.push_back(*handle);
  return handles;
}

TFinding<std::string> ErrorCorrectionOf(TSmbiosStructure const& array) { return array.Byte(0x06).Then(ErrorCorrectionFrom); }

}  // namespace NQRVZEP20
