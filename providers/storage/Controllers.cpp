// SPDX-License-Identifier: Apache-2.0
#include "Controllers.h"

#include "ValueNames.h"
#include "providers/reasons/TIdentifiers.h"

#include <algorithm>
#include <iterator>
#include <map>

namespace NQRVZEP20 {

namespace {

using TText = TFinding<std::string>;
using TCode = TFinding<unsigned short>;

std::string const kSlots = "/sys/bus/pci/slots/";

constexpr unsigned short kModule = 9;  // of PackageType (ValueNames.h)

struct TProtocol {
  char const* fTransport;
  unsigned short fCode;  // of ProtocolSupported (ValueNames.h)
};
constexpr TProtocol kProtocols[] = {{"sata", 48}, {"ata", 6}, {"fc", 10}, {"usb", 16}, {"spi", 9}};

TCode ProtocolFrom(std::string const& transport) {
  constexpr unsigned short kOtherProtocol = 1;
  for (TProtocol const& row : kProtocols)
    if (row.fTransport == transport) return row.fCode;
  return kOtherProtocol;
}

// "8086:2922"
TText NumbersOf(TMachineFiles const& files, std::string const& path) {
  auto const withoutPrefix = [](std::string const& number) {
    return number.compare(0, 2, "0x") == 0 ? number.substr(2) : number;
  };
  return files.Line(path + "/vendor").Then([&](std::string const& vendor) {
    return files.Line(path + "/device").Then([&](std::string const& device) {
      return withoutPrefix(vendor) + ":" + withoutPrefix(device);
    });
  });
}

TIdentifiers IdentifiersOf(TMachineFiles const& files, std::string const& path) {
  TIdentifiers identifiers;
  identifiers.Add("Driver", files.RealName(path + "/driver"));
  identifiers.Add("Kernel module", files.RealName(path + "/driver/module"));
  identifiers.Add("PCI vendor and device", NumbersOf(files, path));
  return identifiers;
}

// "0000:03:00" for each slot name.
std::map<std::string, std::string> SlotsByAddress(TMachineFiles const& files) {
  std::map<std::string, std::string> slots;
  for (std::string const& name : files.Names(kSlots))
    if (TText const address = files.Line(kSlots + name + "/address")) slots.emplace(*address, name);
  return slots;
}

}  // namespace

std::vector<TController> ControllersOf(std::vector<TDisk> const& disks) {
  std::vector<TController> controllers;
  for (TDisk const& disk : disks) {
    if (!disk.fAttachment.fPciPath) continue;
    std::string const& path = *disk.fAttachment.fPciPath;
    auto const isSame = [&](TController const& controller) { return controller.fPath == path; };
    auto found = std::find_if(controllers.begin(), controllers.end(), isSame);
    if (found == controllers.end())
      found = controllers.insert(found, {path.substr(path.rfind('/') + 1), path, disk.fAttachment.fTransport});
    found->fDrives.push_back(disk.fDevice.fName);
  }
  return controllers;
}

TRecord ControllerRecord(TMachineFiles const& files, TController const& controller, TComputerSystem const& system) {
  TIdentifiers const identifiers = IdentifiersOf(files, controller.fPath);
  TMissing const noIdentifier{kMissingNotGiven, "sysfs shows neither a driver nor the numbers of the controller"};
  TRecord record("CIM_PCIController", "sysfs");
  system.AddDeviceKeys(record, controller.fAddress);
  record.Add("ProtocolSupported", controller.fTransport.Then(ProtocolFrom)).Names(kProtocolSupportedNames);
  record.Add("ProtocolDescription", controller.fTransport);
  record.Add("OtherIdentifyingInfo", identifiers.Values(noIdentifier));
  record.Add("IdentifyingDescriptions", identifiers.Descriptions(noIdentifier));
  return record;
}

TRecord BoardRecord(TController const& controller) {
  TText const elsewhere = TMissing{kMissingNotDescribed, "the provider Devices describes this PCI device"};
  TRecord record("CIM_PhysicalPackage", "sysfs");
  record.AddKey("CreationClassName", "CIM_PhysicalPackage");
  record.AddKey("Tag", "controller:" + controller.fAddress);
  record.Add("ElementName", TText("Board of the controller " + controller.fAddress));
  for (char const* property : {"Manufacturer", "Model", "SerialNumber"}) record.Add(property, elsewhere);
  record.Add("PackageType", TCode(kModule)).Names(kPackageTypeNames);
  return record;
}

// Looks at the controller first, and then at the bridges above it.
TText SlotOf(TMachineFiles const& files, TController const& controller) {
  std::map<std::string, std::string> const slots = SlotsByAddress(files);
  for (std::string path = controller.fPath; path.find('/') != path.npos; path.erase(path.rfind('/'))) {
    std::string const name = path.substr(path.rfind('/') + 1);
    auto const found = IsPciAddress(name) ? slots.find(name.substr(0, name.rfind('.'))) : slots.end();
    if (found != slots.end()) return found->second;
  }
  return TMissing{kMissingNotGiven, "the kernel lists no slot for the PCI device " + controller.fAddress};
}

TRecord SlotRecord(TMachineFiles const& files, std::string const& slot) {
  TRecord record("CIM_Slot", "sysfs");
  record.AddKey("Tag", "PCI slot " + slot);
  record.AddKey("CreationClassName", "CIM_Slot");
  record.Add("ElementName", TText(slot));
  record.Add("PoweredOn", files.Number<int>(kSlots + slot + "/power").Then([](int power) { return power != 0; }));
  return record;
}

}  // namespace NQRVZEP20
