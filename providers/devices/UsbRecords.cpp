// SPDX-License-Identifier: Apache-2.0
#include "UsbRecords.h"

#include "PciAddress.h"
#include "providers/reasons/TIdentifiers.h"

#include <algorithm>
#include <charconv>
#include <cmath>
#include <cstdio>
#include <filesystem>

namespace NQRVZEP20 {

namespace {

using TText = TFinding<std::string>;

std::string const kDevices = "/sys/bus/usb/devices/";
constexpr std::uint8_t kClassOfHubs = 9;

// "1-2:1.0" is an interface of the device 1-2; devices and files have no colon in their names.
bool IsInterface(std::string const& name) { return name.find(':') != std::string::npos; }

// The files of a device, or nothing for a record that only declares its class.
class TUsbFiles {
public:
  TUsbFiles() : fFiles(nullptr) {}
  TUsbFiles(TMachineFiles const& files, std::string const& name) : fFiles(&files), fDirectory(kDevices + name + "/") {}

  TText Line(char const* file) const {
    if (fFiles == nullptr) return TMissing{kMissingNotDescribed, "not read"};
    return fFiles->Line(fDirectory + file);
  }

  template <class T>
  TFinding<T> Decimal(char const* file) const {
    return Number<T>(file, 10);
  }

  // The drivers of the device's interfaces, each once.
  std::vector<std::string> Drivers() const {
    std::vector<std::string> drivers;
    if (fFiles == nullptr) return drivers;
    for (std::string const& entry : fFiles->Names(fDirectory)) {
      if (!IsInterface(entry)) continue;
      auto const driver = fFiles->RealName(fDirectory + entry + "/driver");
      if (driver && std::find(drivers.begin(), drivers.end(), *driver) == drivers.end()) drivers.push_back(*driver);
    }
    return drivers;
  }

  // The kernel writes identifiers in hexadecimal digits without a prefix.
  template <class T>
  TFinding<T> Hexadecimal(char const* file) const {
    return Number<T>(file, 16);
  }

private:
  template <class T>
  TFinding<T> Number(char const* file, int base) const {
    return Line(file).Then([base](std::string const& text) -> TFinding<T> {
      T number{};
      auto const [end, error] = std::from_chars(text.data(), text.data() + text.size(), number, base);
      if (error == std::errc() && end == text.data() + text.size()) return number;
      return TMissing{kMissingUnexpected, "\"" + text + "\" is not a number in the expected range"};
    });
  }

  TMachineFiles const* fFiles;
  std::string fDirectory;
};

// A device has a string only if its descriptor refers to one.
TText StringOf(TUsbFiles const& device, char const* file) {
  TText const text = device.Line(file);
  if (text || text.Why().fCode != kMissingNotGiven) return text;
  return TMissing{kMissingNotGiven, "the device does not report it"};
}

TRecord DeviceRecord(char const* className, TComputerSystem const& system, std::string const& name, TUsbFiles const& device) {
  TRecord record(className, "sysfs");
  system.AddDeviceKeys(record, name);
  record.Add("ElementName", StringOf(device, "product"));
  record.Add("Manufacturer", StringOf(device, "manufacturer"));
  record.Add("Product", StringOf(device, "product"));
  record.Add("SerialNumber", StringOf(device, "serial"));
  record.Add("VendorID", device.Hexadecimal<std::uint16_t>("idVendor"));
  record.Add("ProductID", device.Hexadecimal<std::uint16_t>("idProduct"));
  record.Add("DeviceReleaseNumber", device.Hexadecimal<std::uint16_t>("bcdDevice"));
  record.Add("ClassCode", device.Hexadecimal<std::uint8_t>("bDeviceClass"));
  record.Add("SubclassCode", device.Hexadecimal<std::uint8_t>("bDeviceSubClass"));
  record.Add("ProtocolCode", device.Hexadecimal<std::uint8_t>("bDeviceProtocol"));
  record.Add("USBVersionInBCD", device.Line("version").Then(UsbVersionFrom));
  record.Add("MaxPacketSize", device.Decimal<std::uint8_t>("bMaxPacketSize0"));
  record.Add("NumberOfConfigs", device.Decimal<std::uint8_t>("bNumConfigurations"));
  record.Add("CurrentConfigValue", device.Decimal<std::uint8_t>("bConfigurationValue"));
  TIdentifiers identifiers;
  for (std::string const& driver : device.Drivers()) identifiers.Add("Driver", driver);
  identifiers.Add("Maximum power", device.Line("bMaxPower"));
  identifiers.AddTo(record);
  return record;
}

TRecord HubRecord(TComputerSystem const& system, std::string const& name, TUsbFiles const& device) {
  TRecord record = DeviceRecord("CIM_USBHub", system, name, device);
  record.Add("NumberOfPorts", device.Decimal<std::uint8_t>("maxchild"));
  return record;
}

// The directories above that of the device, from the nearest: its hub, and the PCI function that controls it.
std::vector<std::string> NamesAbove(TMachineFiles const& files, std::string const& name) {
  std::vector<std::string> names;
  auto const found = files.RealPath(kDevices + name);
  std::filesystem::path path = found ? *found : "";
  for (path = path.parent_path(); path.has_filename(); path = path.parent_path()) names.push_back(path.filename().string());
  return names;
}

std::string ControllerIn(std::vector<std::string> const& namesAbove) {
  auto const isPci = [](std::string const& name) { return PciAddressFrom(name).has_value(); };
  auto const found = std::find_if(namesAbove.begin(), namesAbove.end(), isPci);
  return found != namesAbove.end() ? *found : "";
}

bool IsRootHub(std::string const& name) { return name.compare(0, 3, "usb") == 0; }

}  // namespace

std::vector<TUsbDevice> UsbDevices(TMachineFiles const& files, TComputerSystem const& system) {
  std::vector<TUsbDevice> devices;
  for (std::string const& name : files.Names(kDevices)) {
    if (IsInterface(name)) continue;
    TUsbFiles const device(files, name);
    auto const cls = device.Hexadecimal<std::uint8_t>("bDeviceClass");
    if (!cls) continue;
    bool const isHub = *cls == kClassOfHubs;
    auto const above = NamesAbove(files, name);
    devices.push_back({name, IsRootHub(name) || above.empty() ? "" : above.front(), ControllerIn(above), isHub,
                       device.Line("speed").Then(UsbSpeedFrom),
                       isHub ? HubRecord(system, name, device) : DeviceRecord("CIM_USBDevice", system, name, device)});
  }
  return devices;
}

TFinding<std::uint64_t> UsbSpeedFrom(std::string const& text) {
  double megabits = 0;
  auto const [end, error] = std::from_chars(text.data(), text.data() + text.size(), megabits);
  if (error == std::errc() && end == text.data() + text.size() && megabits > 0 && megabits < 1e9)
    return static_cast<std::uint64_t>(std::llround(megabits * 1e6));
  return TMissing{kMissingNotGiven, "the kernel does not know the speed: \"" + text + "\""};
}

TFinding<std::uint16_t> UsbVersionFrom(std::string const& text) {
  unsigned major = 0, minor = 0;
  int length = 0;
  int const count = std::sscanf(text.c_str(), "%2x.%2x%n", &major, &minor, &length);
  if (count == 2 && static_cast<std::size_t>(length) == text.size()) return static_cast<std::uint16_t>(major << 8 | minor);
  return TMissing{kMissingUnexpected, "\"" + text + "\" is not a version of USB"};
}

TRecord UsbDeviceShape(TComputerSystem const& system) { return DeviceRecord("CIM_USBDevice", system, "", TUsbFiles()); }
TRecord UsbHubShape(TComputerSystem const& system) { return HubRecord(system, "", TUsbFiles()); }

TMissing WhyNoUsbDevices(TMachineFiles const& files) {
  if (!files.Exists(kDevices)) return {kMissingNotGiven, "the kernel lists no USB devices: " + kDevices + " does not exist"};
  return {kMissingNotGiven, "no USB devices are listed in " + kDevices};
}

}  // namespace NQRVZEP20
