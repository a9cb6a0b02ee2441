// SPDX-License-Identifier: Apache-2.0
#include "SmbiosRecords.h"

#include "SmbiosFields.h"
#include "TCIMDateTime.h"
#include "TCIMSchemaHelper.h"
#include "TZEPException.h"
#include "ValueNames.h"

#include <algorithm>
#include <cstdio>

namespace NQRVZEP20 {

namespace {

// ---- System ----

// Bytes in the order in which a UUID is printed.
TFinding<std::string> UuidFrom(std::vector<unsigned char> const& u) {
  if (AreAll(u, 0x00)) return TMissing{kMissingNotGiven, "not set by the firmware (all zeros)"};
  if (AreAll(u, 0xff)) return TMissing{kMissingNotGiven, "not set by the firmware (all ones)"};
  char text[37];
  std::snprintf(text, sizeof text, "%02X%02X%02X%02X-%02X%02X-%02X%02X-%02X%02X-%02X%02X%02X%02X%02X%02X", u[0], u[1], u[2], u[3],
                u[4], u[5], u[6], u[7], u[8], u[9], u[10], u[11], u[12], u[13], u[14], u[15]);
  return WithoutPlaceholder(text);
}

// The first three fields are little-endian since version 2.6 of the standard; before, they have the printed order.
TFinding<std::string> UuidOf(TSmbiosStructure const& system, TFinding<std::optional<TSmbiosVersion>> const& version) {
  auto const stored = system.Bytes(0x08, 16);
  if (!stored) return stored.Why();
  if (!version) return TMissing{version.Why().fCode, "the byte order is unknown: " + version.Why().fReason};
  bool const isLittleEndian = !*version || **version >= TSmbiosVersion(2, 6);
  std::vector<unsigned char> bytes = *stored;
  if (isLittleEndian) {
    std::reverse(bytes.begin(), bytes.begin() + 4);
    std::reverse(bytes.begin() + 4, bytes.begin() + 6);
    std::reverse(bytes.begin() + 6, bytes.begin() + 8);
  }
  return UuidFrom(bytes);
}

// ---- BIOS ----

bool IsDayOfMonth(unsigned day, unsigned month, unsigned year) {
  constexpr unsigned days[] = {31, 28, 31, 30, 31, 30, 31, 31, 30, 31, 30, 31};
  if (month < 1 || month > 12) return false;
  bool const leapDay = month == 2 && year % 4 == 0 && (year % 100 != 0 || year % 400 == 0);
  return day >= 1 && day <= days[month - 1] + (leapDay ? 1 : 0);
}

// "mm/dd/yyyy"; "mm/dd/yy" is of the 20th century.
TFinding<TCIMDateTime> DateFrom(std::string const& text) {
  TMissing const notADate{kMissingUnexpected, "not in the expected form: \"" + text + "\" is not a date"};
  std::string shape = text;
  for (char& c : shape)
    if (c >= '0' && c <= '9') c = '9';
  if (shape != "99/99/9999" && shape != "99/99/99") return notADate;

  unsigned const month = std::stoul(text.substr(0, 2));
  unsigned const day = std::stoul(text.substr(3, 2));
  unsigned const year = std::stoul(text.substr(6)) + (shape.size() == 8 ? 1900 : 0);
  if (!IsDayOfMonth(day, month, year)) return notADate;
  try {
    return TCIMDateTime(static_cast<unsigned short>(year), static_cast<unsigned short>(month), day, 0, 0, 0, 0, 0);
  } catch (TZEPException const&) {
    return notADate;
  }
}

// The start address of a BIOS of the old kind, from its segment; UEFI firmware has 0.
TFinding<std::uint64_t> StartAddressOf(TSmbiosStructure const& bios) {
  return NumberOf<std::uint64_t>(bios.Word(0x06), std::uint16_t(0)).Then([](std::uint64_t segment) { return segment << 4; });
}

// Such a BIOS ends where the first megabyte ends.
TFinding<std::uint64_t> EndAddressOf(TSmbiosStructure const& bios) {
  return StartAddressOf(bios).Then([](std::uint64_t) { return std::uint64_t(0xfffff); });
}

// ---- Chassis ----

constexpr char const* kChassisTypes[] = {"Other",
                                         "Unknown",
                                         "Desktop",
                                         "Low Profile Desktop",
                                         "Pizza Box",
                                         "Mini Tower",
                                         "Tower",
                                         "Portable",
                                         "Laptop",
                                         "Notebook",
                                         "Hand Held",
                                         "Docking Station",
                                         "All in One",
                                         "Sub Notebook",
                                         "Space-saving",
                                         "Lunch Box",
                                         "Main Server Chassis",
                                         "Expansion Chassis",
                                         "Sub Chassis",
                                         "Bus Expansion Chassis",
                                         "Peripheral Chassis",
                                         "RAID Chassis",
                                         "Rack Mount Chassis",
                                         "Sealed-case PC",
                                         "Multi-system Chassis",
                                         "Compact PCI",
                                         "Advanced TCA",
                                         "Blade",
                                         "Blade Enclosure",
                                         "Tablet",
                                         "Convertible",
                                         "Detachable",
                                         "IoT Gateway",
                                         "Embedded PC",
                                         "Mini PC",
                                         "Stick PC"};  // from 1

constexpr std::uint8_t kChassisTypeOther = 1;
constexpr std::uint8_t kChassisTypeUnknown = 2;
constexpr std::uint8_t kChassisTypeBlade = 28;
constexpr std::uint8_t kChassisTypeBladeEnclosure = 29;

// The highest bit of the type states whether the chassis has a lock.
constexpr std::uint8_t kChassisLockBit = 0x80;

TFinding<std::uint8_t> ChassisTypeFrom(std::uint8_t field) {
  std::uint8_t const type = field & ~kChassisLockBit;
  if (type == kChassisTypeUnknown) return Unknown();
  if (type == 0 || type > std::size(kChassisTypes))
    return TMissing{kMissingUnexpected, "not in the expected form: chassis type " + std::to_string(type)};
  return type;
}

TFinding<std::uint8_t> ChassisTypeOf(TSmbiosStructure const& chassis) { return chassis.Byte(0x05).Then(ChassisTypeFrom); }

// CIM numbers the types as SMBIOS does, but has no blade, and gives a blade enclosure the number before.
std::uint16_t PackageTypeFrom(std::uint8_t chassisType) {
  if (chassisType == kChassisTypeBlade) return kChassisTypeOther;
  if (chassisType == kChassisTypeBladeEnclosure) return kChassisTypeBladeEnclosure - 1;
  return chassisType;
}

std::string ChassisTypeName(std::uint8_t type) { return kChassisTypes[type - 1]; }

TFinding<bool> LockOf(TSmbiosStructure const& chassis) {
  return chassis.Byte(0x05).Then([](std::uint8_t type) { return (type & kChassisLockBit) != 0; });
}

// In inches. SMBIOS counts rack units of 1.75 inches.
TFinding<float> HeightOf(TSmbiosStructure const& chassis) {
  return NumberOf<float>(chassis.Byte(0x11), std::uint8_t(0)).Then([](float units) { return units * 1.75f; });
}

// The SKU follows the list of contained elements: a count and the size of one, then the elements.
TFinding<std::string> ChassisSkuOf(TSmbiosStructure const& chassis) {
  return chassis.Byte(0x13).Then([&](std::size_t count) {
    return chassis.Byte(0x14).Then([&](std::size_t size) { return TextOf(chassis, 0x15 + count * size); });
  });
}

// ---- Memory ----

// The CIM number for each SMBIOS number, from 0; -1 for unknown and for numbers without a meaning.
constexpr int kFormFactors[] = {-1, 1, -1, 7, 2, 1, 3, 4, 6, 8, 9, 1, 11, 12, 13, 8, 1};
constexpr int kMemoryTypes[] = {-1, 1,  -1, 2,  6,  7,  8,  9,  10, 11, 12, 13, 14, 15, 16, 17,
                                18, 19, 20, 21, 23, -1, -1, -1, 24, 25, 26, 27, 28, 29, 30};

// A number after the end of the table, such as that of a newer kind of memory, becomes "Other".
template <std::size_t N>
TFinding<std::uint16_t> CimNumberOf(TFinding<std::uint8_t> const& found, int const (&table)[N]) {
  return found.Then([&table](std::uint8_t number) -> TFinding<std::uint16_t> {
    constexpr std::uint16_t other = 1;
    if (number >= N) return other;
    if (table[number] < 0) return Unknown();
    return static_cast<std::uint16_t>(table[number]);
  });
}

// The schema's name, or that of SMBIOS for the types after the end of the schema's list.
TFinding<std::string> MemoryTypeNameFrom(std::uint8_t type) {
  constexpr char const* newer[] = {"Logical non-volatile device", "HBM", "HBM2", "DDR5", "LPDDR5", "HBM3"};
  if (type >= std::size(kMemoryTypes)) return WordFor(type, newer, std::size(kMemoryTypes), "memory type");
  return CimNumberOf(TFinding<std::uint8_t>(type), kMemoryTypes).Then([](std::uint16_t number) {
    return std::string(kMemoryTypeNames[number].fName);
  });
}

// The highest bit of the extended fields is reserved.
std::uint32_t WithoutReservedBit(std::uint32_t number) { return number & 0x7fffffff; }

// In bytes. The size field counts kilobytes or megabytes; from 32 GB on, the extended field counts megabytes.
TFinding<std::uint64_t> CapacityOf(TSmbiosStructure const& memoryDevice) {
  constexpr std::uint16_t unknown = 0xffff, seeExtended = 0x7fff, inKilobytes = 0x8000;
  auto const fromMegabytes = [](std::uint64_t megabytes) { return megabytes << 20; };
  auto const size = memoryDevice.Word(0x0c);
  if (IsNumber(size, seeExtended)) return memoryDevice.DWord(0x1c).Then(WithoutReservedBit).Then(fromMegabytes);
  return NumberOf<std::uint64_t>(size, unknown).Then([fromMegabytes](std::uint64_t number) {
    return number & inKilobytes ? (number & ~std::uint64_t(inKilobytes)) << 10 : fromMegabytes(number);
  });
}

// In millions of transfers per second, which CIM calls megahertz. 65535 refers to the wider extended field.
TFinding<std::uint32_t> SpeedOf(TSmbiosStructure const& memoryDevice, std::size_t offset, std::size_t extendedOffset) {
  constexpr std::uint16_t unknown = 0, seeExtended = 0xffff;
  auto const speed = memoryDevice.Word(offset);
  if (!IsNumber(speed, seeExtended)) return NumberOf<std::uint32_t>(speed, unknown);
  return NumberOf<std::uint32_t>(memoryDevice.DWord(extendedOffset).Then(WithoutReservedBit), std::uint32_t(unknown));
}

// Either all kinds or all texts.
TFinding<std::vector<std::string>> PartOf(TIdentifyingTexts const& texts, TSmbiosStructure const& system,
                                          std::string std::pair<std::string, std::string>::*part) {
  std::vector<std::string> parts;
  for (auto const& text : texts.fTexts) parts.push_back(text.*part);
  if (!parts.empty()) return parts;
  auto const handle = system.Handle();
  return handle ? TMissing{kMissingNotGiven, "the SMBIOS tables contain no strings of type 11 or 12"} : handle.Why();
}

}  // namespace

TRecord ComputerSystemRecord(TSmbiosStructure const& system, std::string const& source, TSystemName const& name,
                             TFinding<std::optional<TSmbiosVersion>> const& version, TIdentifyingTexts const& texts) {
  TRecord record(TCIMSchemaHelper::kSystemCreationClassName, name.fSource, "CIM_ComputerSystem");
  record.AddKey("CreationClassName", TCIMSchemaHelper::kSystemCreationClassName);
  record.AddKey("Name", name.fName);
  record.SetSource(source);
  record.Add("Manufacturer", TextOf(system, 0x04));
  record.Add("ProductName", TextOf(system, 0x05));
  record.Add("Version", TextOf(system, 0x06));
  record.Add("SerialNumber", TextOf(system, 0x07));
  record.Add("UUID", UuidOf(system, version));
  record.Add("SKUNumber", TextOf(system, 0x19));
  record.Add("Family", TextOf(system, 0x1a));
  record.SetSource(texts.fSource);
  record.Add("IdentifyingDescriptions", PartOf(texts, system, &std::pair<std::string, std::string>::first));
  record.Add("OtherIdentifyingInfo", PartOf(texts, system, &std::pair<std::string, std::string>::second));
  return record;
}

TRecord BiosRecord(TSmbiosStructure const& bios, std::string const& source, unsigned number) {
  constexpr unsigned short running = 3, unknownSystem = 0;
  TRecord record("CIM_BIOSElement", source);
  record.AddKey("Name", "BIOS " + std::to_string(number));
  record.AddKey("Version", TextOf(bios, 0x05));
  record.AddKey("SoftwareElementState", running).Names(kSoftwareElementStateNames);
  record.AddKey("SoftwareElementID", "BIOS " + std::to_string(number));
  record.AddKey("TargetOperatingSystem", unknownSystem).Names(kTargetOperatingSystemNames);
  record.Add("Manufacturer", TextOf(bios, 0x04));
  record.Add("ReleaseDate", TextOf(bios, 0x08).Then(DateFrom));
  record.Add("LoadedStartingAddress", StartAddressOf(bios));
  record.Add("LoadedEndingAddress", EndAddressOf(bios));
  return record;
}

TRecord ChassisRecord(TSmbiosStructure const& chassis, std::string const& source, unsigned number) {
  TRecord record("CIM_Chassis", source);
  record.AddKey("Tag", "Chassis " + std::to_string(number));
  record.AddKey("CreationClassName", "CIM_Chassis");
  record.Add("Manufacturer", TextOf(chassis, 0x04));
  record.Add("Version", TextOf(chassis, 0x06));
  record.Add("SerialNumber", TextOf(chassis, 0x07));
  record.Add("UserTracking", TextOf(chassis, 0x08));
  record.Add("SKU", ChassisSkuOf(chassis));
  record.Add("ChassisPackageType", ChassisTypeOf(chassis).Then(PackageTypeFrom)).Names(kChassisPackageTypeNames);
  record.Add("ChassisTypeDescription", ChassisTypeOf(chassis).Then(ChassisTypeName));
  record.Add("LockPresent", LockOf(chassis));
  record.Add("Height", HeightOf(chassis)).Unit("inch");
  record.Add("NumberOfPowerCords", NumberOf<std::uint16_t>(chassis.Byte(0x12), std::uint8_t(0)));
  return record;
}

TRecord MemoryRecord(TSmbiosStructure const& memoryDevice, std::string const& source, unsigned number) {
  TRecord record("CIM_PhysicalMemory", source);
  record.AddKey("Tag", "Memory device " + std::to_string(number));
  record.AddKey("CreationClassName", "CIM_PhysicalMemory");
  record.Add("ElementName", TextOf(memoryDevice, 0x10));
  record.Add("BankLabel", TextOf(memoryDevice, 0x11));
  record.Add("Manufacturer", TextOf(memoryDevice, 0x17));
  record.Add("SerialNumber", TextOf(memoryDevice, 0x18));
  record.Add("UserTracking", TextOf(memoryDevice, 0x19));
  record.Add("PartNumber", TextOf(memoryDevice, 0x1a));
  record.Add("Capacity", CapacityOf(memoryDevice)).Unit("byte");
  record.Add("FormFactor", CimNumberOf(memoryDevice.Byte(0x0e), kFormFactors)).Names(kFormFactorNames);
  record.Add("MemoryType", CimNumberOf(memoryDevice.Byte(0x12), kMemoryTypes)).Names(kMemoryTypeNames);
  record.Add("Description", memoryDevice.Byte(0x12).Then(MemoryTypeNameFrom));
  record.Add("TotalWidth", NumberOf<std::uint16_t>(memoryDevice.Word(0x08), std::uint16_t(0xffff))).Unit("bit");
  record.Add("DataWidth", NumberOf<std::uint16_t>(memoryDevice.Word(0x0a), std::uint16_t(0xffff))).Unit("bit");

  // SMBIOS states the speed in megahertz, not the time in nanoseconds.
  auto const speed = SpeedOf(memoryDevice, 0x15, 0x54);
  record.Add("IsSpeedInMhz", TFinding<bool>(static_cast<bool>(speed)));
  record.Add("MaxMemorySpeed", speed).Unit("hertz * 10^6");
  record.Add("ConfiguredMemoryClockSpeed", SpeedOf(memoryDevice, 0x20, 0x58)).Unit("hertz * 10^6");
  return record;
}

bool IsSlotFilled(TSmbiosStructure const& memoryDevice) { return !IsNumber(memoryDevice.Word(0x0c), std::uint16_t(0)); }

}  // namespace NQRVZEP20
