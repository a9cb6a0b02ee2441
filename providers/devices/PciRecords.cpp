// SPDX-License-Identifier: Apache-2.0
#include "PciRecords.h"

#include "PciLink.h"
#include "ValueNames.h"
#include "providers/reasons/TIdentifiers.h"

#include <algorithm>
#include <cstdio>

namespace NQRVZEP20 {

namespace {

using TText = TFinding<std::string>;

std::string const kDevices = "/sys/bus/pci/devices/";
std::string const kSlots = "/sys/bus/pci/slots/";
constexpr std::uint32_t kClassOfBridges = 0x06;
constexpr unsigned kPciBridge = 0x04;  // a subclass

TMissing Unread() { return {kMissingNotDescribed, "not read"}; }

// A function's numbers and files, or nothing for a record that only declares its class.
class TPciFiles {
public:
  TPciFiles() : fFiles(nullptr) {}
  TPciFiles(TMachineFiles const& files, std::string const& name)
      : fFiles(&files), fDirectory(kDevices + name + "/"), fNumbers(ReadNumbers()) {}

  TFinding<TPciNumbers> const& Numbers() const { return fNumbers; }
  template <class T>
  TFinding<T> Number(char const* file) const {
    if (fFiles == nullptr) return Unread();
    return fFiles->Number<T>(fDirectory + file);
  }
  TText Line(char const* file) const {
    if (fFiles == nullptr) return Unread();
    return fFiles->Line(fDirectory + file);
  }
  TText RealName(char const* file) const {
    if (fFiles == nullptr) return Unread();
    return fFiles->RealName(fDirectory + file);
  }
  // A little-endian number in the header of the configuration space, which every user may read.
  template <class T>
  TFinding<T> Configuration(std::size_t offset) const {
    if (fFiles == nullptr) return Unread();
    return fFiles->Bytes(fDirectory + "config", offset, sizeof(T)).Then([](std::string const& bytes) -> TFinding<T> {
      if (bytes.size() < sizeof(T)) return TMissing{kMissingUnreadable, "the configuration space is cut off"};
      T number = 0;
      for (std::size_t at = sizeof(T); at-- > 0;) number = static_cast<T>(number << 8 | static_cast<unsigned char>(bytes[at]));
      return number;
    });
  }
  bool Has(char const* file) const { return fFiles != nullptr && fFiles->Exists(fDirectory + file); }

private:
  TFinding<TPciNumbers> ReadNumbers() const {
    auto const cls = Number<std::uint32_t>("class");
    auto const vendor = Number<std::uint16_t>("vendor"), device = Number<std::uint16_t>("device");
    auto const subVendor = Number<std::uint16_t>("subsystem_vendor"), subDevice = Number<std::uint16_t>("subsystem_device");
    if (!cls) return cls.Why();
    if (!vendor) return vendor.Why();
    if (!device) return device.Why();
    return TPciNumbers{*vendor, *device, subVendor ? *subVendor : std::uint16_t(0), subDevice ? *subDevice : std::uint16_t(0),
                       *cls};
  }

  TMachineFiles const* fFiles;
  std::string fDirectory;
  TFinding<TPciNumbers> fNumbers = Unread();
};

// The vendor and the device: "Intel Corporation 82574L Gigabit Network Connection".
TText FullNameOf(TPciNames const& names) {
  if (!names.fDevice) return names.fVendor;
  return names.fVendor.Then([&](std::string const& vendor) { return vendor + " " + *names.fDevice; });
}

// A subsystem whose vendor is 0 is not programmed.
TFinding<std::uint16_t> SubsystemNumber(TFinding<TPciNumbers> const& numbers, std::uint16_t TPciNumbers::*number) {
  return numbers.Then([number](TPciNumbers const& n) -> TFinding<std::uint16_t> {
    if (n.fSubsystemVendor == 0) return TMissing{kMissingNotGiven, "the device has no subsystem"};
    return n.*number;
  });
}

// The last two hexadecimal digits of the class.
std::string ProgrammingInterfaceFrom(TPciNumbers const& numbers) {
  char text[3];
  std::snprintf(text, sizeof text, "%02x", numbers.fClass & 0xffu);
  return text;
}

TIdentifiers IdentifiersOf(TPciFiles const& function, TPciNames const& names) {
  TIdentifiers identifiers;
  identifiers.Add("Vendor", names.fVendor);
  identifiers.Add("Subsystem", names.fSubsystem);
  identifiers.Add("Programming interface", function.Numbers().Then(ProgrammingInterfaceFrom));
  identifiers.Add("Driver", function.RealName("driver"));
  identifiers.Add("Kernel module", function.RealName("driver/module"));
  identifiers.Add("Firmware label", function.Line("label"));
  identifiers.Add("NUMA node", function.Number<int>("numa_node").Then([](int node) -> TText {
    if (node < 0) return TMissing{kMissingNotGiven, "the kernel reports no NUMA node"};
    return std::to_string(node);
  }));
  return identifiers;
}

TRecord FunctionRecord(char const* className, TComputerSystem const& system, std::string const& name, TPciAddress const& address,
                       TPciFiles const& function, TPciNames const& names) {
  auto const& numbers = function.Numbers();
  TRecord record(className, "pci.ids");
  system.AddDeviceKeys(record, name);
  record.Add("Name", FullNameOf(names));
  record.Add("ElementName", names.fDevice);
  record.Add("Caption", names.fClass);
  record.SetSource("sysfs");
  record.Add("ClassCode", numbers.Then([](TPciNumbers const& n) { return std::uint8_t(n.fClass >> 16); })).Names(kClassCodeNames);
  record.Add("VendorID", numbers.Then([](TPciNumbers const& n) { return n.fVendor; }));
  record.Add("PCIDeviceID", numbers.Then([](TPciNumbers const& n) { return n.fDevice; }));
  record.Add("SubsystemVendorID", SubsystemNumber(numbers, &TPciNumbers::fSubsystemVendor));
  record.Add("SubsystemID", SubsystemNumber(numbers, &TPciNumbers::fSubsystem));
  record.Add("RevisionID", function.Number<std::uint8_t>("revision"));
  record.Add("BusNumber", TFinding<std::uint8_t>(address.fBus));
  record.Add("DeviceNumber", TFinding<std::uint8_t>(address.fDevice));
  record.Add("FunctionNumber", TFinding<std::uint8_t>(address.fFunction));
  record.Add("CommandRegister", function.Configuration<std::uint16_t>(0x04));
  auto const cacheLineAndLatency = function.Configuration<std::uint16_t>(0x0c);  // one read: the hypervisor handles each
  record.Add("CacheLineSize", cacheLineAndLatency.Then([](std::uint16_t both) { return std::uint8_t(both); }))
      .Unit("dataword * 2");
  record.Add("LatencyTimer", cacheLineAndLatency.Then([](std::uint16_t both) { return std::uint8_t(both >> 8); })).Unit("cycle");
  record.Add("InterruptPin", function.Configuration<std::uint8_t>(0x3d).Then([](std::uint8_t pin) { return std::uint16_t(pin); }))
      .Names(kInterruptPinNames);
  IdentifiersOf(function, names).AddTo(record);
  return record;
}

TFinding<std::uint16_t> BridgeTypeOf(TPciFiles const& function) {
  return function.Numbers().Then([&](TPciNumbers const& numbers) {
    constexpr std::uint16_t pciExpress = 10, other = 128, lastOfPci = 0x08;
    unsigned const subclass = (numbers.fClass >> 8) & 0xff;
    if (subclass == kPciBridge && function.Has("current_link_speed")) return pciExpress;
    // CIM numbers the other bridges as the PCI standard does, up to RACEway.
    return subclass <= lastOfPci ? static_cast<std::uint16_t>(subclass) : other;
  });
}

// Only a bridge to another PCI bus has bus numbers.
TFinding<std::uint8_t> BusNumber(TPciFiles const& function, char const* file) {
  if (!function.Has(file)) return TMissing{kMissingNotApplicable, "the bridge does not lead to a PCI bus"};
  return function.Number<std::uint8_t>(file);
}

TRecord BridgeRecord(TComputerSystem const& system, std::string const& name, TPciAddress const& address,
                     TPciFiles const& function, TPciNames const& names) {
  TRecord record = FunctionRecord("CIM_PCIBridge", system, name, address, function, names);
  record.Add("BridgeType", BridgeTypeOf(function)).Names(kBridgeTypeNames);
  record.Add("PrimaryBusNumber", TFinding<std::uint8_t>(address.fBus));
  record.Add("SecondayBusNumber", BusNumber(function, "secondary_bus_number"));  // the spelling of the schema
  record.Add("SubordinateBusNumber", BusNumber(function, "subordinate_bus_number"));
  return record;
}

TFinding<float> RateOf(TPciFiles const& function, char const* file) { return function.Line(file).Then(PciTransferRateFrom); }

TFinding<std::uint16_t> WidthOf(TPciFiles const& function, char const* file) {
  return function.Number<std::uint16_t>(file).Then(PciWidthFrom);
}

TFinding<std::uint64_t> SpeedOf(TFinding<float> const& rate, TFinding<std::uint16_t> const& width) {
  return rate.Then(
      [&](float transfers) { return width.Then([&](std::uint16_t lanes) { return PciSpeedFrom(transfers, lanes); }); });
}

TPciLink LinkOf(TComputerSystem const& system, std::string const& name, TPciFiles const& function) {
  constexpr unsigned short pciExpress = 152;
  auto const rate = RateOf(function, "current_link_speed"), maxRate = RateOf(function, "max_link_speed");
  auto const width = WidthOf(function, "current_link_width"), maxWidth = WidthOf(function, "max_link_width");
  auto const speed = SpeedOf(rate, width);

  TRecord record("ZEP_PCIExpressLink", "sysfs", "CIM_PCIPort");
  system.AddDeviceKeys(record, name);
  record.AddOwn("PortType", pciExpress).Names(kPortTypeNames);
  record.Add("TransferRate", rate);
  record.Add("MaxTransferRate", maxRate);
  record.Add("Width", width);
  record.Add("MaxWidth", maxWidth);
  record.Add("Speed", speed).Unit("bit / second");
  record.Add("MaxSpeed", SpeedOf(maxRate, maxWidth)).Unit("bit / second");
  return {record, speed};
}

// The name of the bridge above: the directory of a function lies in that of its bridge.
std::string BridgeAbove(TMachineFiles const& files, std::string const& name) {
  auto const path = files.RealPath(kDevices + name);
  if (!path) return "";
  std::string const above = path->substr(0, path->rfind('/'));
  std::string const bridge = above.substr(above.rfind('/') + 1);
  return PciAddressFrom(bridge) ? bridge : "";
}

TPciNames NoNames() { return {Unread(), Unread(), Unread(), Unread()}; }

}  // namespace

std::vector<TPciFunction> PciFunctions(TMachineFiles const& files, TComputerSystem const& system) {
  TPciIds ids;
  std::vector<TPciFunction> functions;
  for (std::string const& name : files.Names(kDevices)) {
    auto const address = PciAddressFrom(name);
    TPciFiles const function(files, name);
    if (!address || !function.Numbers()) continue;
    TPciNames const names = ids.NamesOf(*function.Numbers(), files);
    bool const isBridge = function.Numbers()->fClass >> 16 == kClassOfBridges;
    functions.push_back({name, *address, BridgeAbove(files, name), isBridge,
                         isBridge ? BridgeRecord(system, name, *address, function, names)
                                  : FunctionRecord("CIM_PCIDevice", system, name, *address, function, names),
                         std::nullopt});
    if (function.Has("current_link_speed")) functions.back().fLink = LinkOf(system, name, function);
  }
  std::sort(functions.begin(), functions.end(), [](TPciFunction const& a, TPciFunction const& b) { return a.fName < b.fName; });
  return functions;
}

TRecord PciDeviceShape(TComputerSystem const& system) {
  return FunctionRecord("CIM_PCIDevice", system, "", {}, TPciFiles(), NoNames());
}
TRecord PciBridgeShape(TComputerSystem const& system) { return BridgeRecord(system, "", {}, TPciFiles(), NoNames()); }
TRecord PciLinkShape(TComputerSystem const& system) { return LinkOf(system, "", TPciFiles()).fRecord; }

TMissing WhyNoPciDevices(TMachineFiles const& files) {
  if (!files.Exists(kDevices)) return {kMissingNoSource, "the kernel lists no PCI devices: " + kDevices + " does not exist"};
  return {kMissingNotGiven, "no PCI devices are listed in " + kDevices};
}

std::vector<TPciSlot> PciSlots(TMachineFiles const& files) {
  std::vector<TPciSlot> slots;
  for (std::string const& name : files.Names(kSlots)) {
    auto const address = files.Line(kSlots + name + "/address");
    TRecord record("CIM_Slot", "sysfs");
    record.AddKey("Tag", "PCI slot " + name);
    record.AddKey("CreationClassName", "CIM_Slot");
    record.Add("ElementName", TText(name));
    record.Add("PoweredOn", files.Number<unsigned>(kSlots + name + "/power").Then([](unsigned power) { return power != 0; }));
    slots.push_back({address ? *address : "", record});
  }
  return slots;
}

TRecord PciSlotShape() {
  TRecord record("CIM_Slot", "sysfs");
  record.AddKey("Tag", "");
  record.AddKey("CreationClassName", "CIM_Slot");
  record.Add("ElementName", TText(Unread()));
  record.Add("PoweredOn", TFinding<bool>(Unread()));
  return record;
}

}  // namespace NQRVZEP20
