// SPDX-License-Identifier: Apache-2.0
#include "DevicesNamespace.h"

#include "PciRecords.h"
#include "UsbRecords.h"
#include "providers/memory/TMemoryNamespace.h"
#include "providers/reasons/TRecordWriter.h"

#include <map>

namespace NQRVZEP20 {

namespace {

constexpr TAssociation kControlledBy{"CIM_ControlledBy", "Antecedent", "CIM_Controller", "Dependent", "CIM_LogicalDevice"};
constexpr TAssociation kConcreteComponent{"CIM_ConcreteComponent", "GroupComponent", "CIM_ManagedElement", "PartComponent",
                                          "CIM_ManagedElement"};
constexpr TAssociation kPortOnDevice{"CIM_PortOnDevice", "Antecedent", "CIM_LogicalDevice", "Dependent", "CIM_LogicalPort"};
constexpr TAssociation kRealizes{"CIM_Realizes", "Antecedent", "CIM_PhysicalElement", "Dependent", "CIM_LogicalDevice"};

using TRecords = std::vector<TRecord>;
using TRecordsByName = std::map<std::string, TRecord const*>;

// The records of the elements that `isWanted`.
template <class TElement, class TIsWanted>
TRecords RecordsOf(std::vector<TElement> const& elements, TIsWanted isWanted) {
  TRecords records;
  for (TElement const& element : elements)
    if (isWanted(element)) records.push_back(element.fRecord);
  return records;
}

template <class TElement>
TRecordsByName ByName(std::vector<TElement> const& elements) {
  TRecordsByName byName;
  for (TElement const& element : elements) byName[element.fName] = &element.fRecord;
  return byName;
}

TRecord const* Find(TRecordsByName const& byName, std::string const& name) {
  auto const found = byName.find(name);
  return found != byName.end() ? found->second : nullptr;
}

// The speed of the connection to the controller.
TRecord Negotiated(TFinding<std::uint64_t> const& speed) {
  TRecord connection(kControlledBy.fClassName, "sysfs");
  connection.Add("NegotiatedSpeed", speed).Unit("bit / second");
  return connection;
}

TFinding<std::uint64_t> LinkSpeedOf(TPciFunction const& function) {
  if (function.fLink) return function.fLink->fSpeed;
  return TMissing{kMissingNotGiven, "the kernel reports the speed of PCI Express links only"};
}

// The devices come before the bridges, whose class is a subclass of theirs.
void WritePci(TRecordWriter& writer, TMachineFiles const& files, TComputerSystem const& system,
              std::vector<TPciFunction> const& functions) {
  TMissing const whyNone = WhyNoPciDevices(files);
  writer.Write(PciDeviceShape(system), RecordsOf(functions, [](TPciFunction const& f) { return !f.fIsBridge; }), whyNone);
  writer.Write(PciBridgeShape(system), RecordsOf(functions, [](TPciFunction const& f) { return f.fIsBridge; }), whyNone);

  TRecords links;
  for (TPciFunction const& function : functions)
    if (function.fLink) links.push_back(function.fLink->fRecord);
  writer.Write(PciLinkShape(system), links,
               functions.empty() ? whyNone : TMissing{kMissingNotGiven, "the kernel lists no PCI Express devices"});
}

void TiePci(TRecordWriter& writer, TRecord const& system, std::vector<TPciFunction> const& functions) {
  TRecordsByName const byName = ByName(functions);
  for (TPciFunction const& function : functions) {
    writer.Associate(kSystemDevice, system, function.fRecord);
    if (TRecord const* const bridge = Find(byName, function.fBridge))
      writer.Associate(kControlledBy, *bridge, function.fRecord, Negotiated(LinkSpeedOf(function)));
    if (function.fLink) writer.Associate(kPortOnDevice, function.fRecord, function.fLink->fRecord);
  }
}

void WriteSlots(TRecordWriter& writer, TMachineFiles const& files, std::vector<TPciFunction> const& functions) {
  auto const slots = PciSlots(files);
  writer.Write(PciSlotShape(), RecordsOf(slots, [](TPciSlot const&) { return true; }),
               {kMissingNotGiven, "the kernel lists no PCI slots in /sys/bus/pci/slots"});
  for (TPciSlot const& slot : slots)
    for (TPciFunction const& function : functions)
      if (function.fName.compare(0, slot.fAddress.size() + 1, slot.fAddress + ".") == 0)
        writer.Associate(kRealizes, slot.fRecord, function.fRecord);
}

void WriteUsb(TRecordWriter& writer, TMachineFiles const& files, TComputerSystem const& system,
              std::vector<TUsbDevice> const& devices) {
  TMissing const whyNone = WhyNoUsbDevices(files);
  writer.Write(UsbDeviceShape(system), RecordsOf(devices, [](TUsbDevice const& d) { return !d.fIsHub; }), whyNone);
  writer.Write(UsbHubShape(system), RecordsOf(devices, [](TUsbDevice const& d) { return d.fIsHub; }), whyNone);
}

void TieUsb(TRecordWriter& writer, TRecord const& system, std::vector<TUsbDevice> const& devices,
            std::vector<TPciFunction> const& functions) {
  TRecordsByName const byName = ByName(devices), controllers = ByName(functions);
  for (TUsbDevice const& device : devices) {
    writer.Associate(kSystemDevice, system, device.fRecord);
    if (TRecord const* const controller = Find(controllers, device.fController))
      writer.Associate(kControlledBy, *controller, device.fRecord, Negotiated(device.fSpeed));
    if (TRecord const* const hub = Find(byName, device.fHub)) writer.Associate(kConcreteComponent, *hub, device.fRecord);
  }
}

}  // namespace

void FillDevicesNamespace(TMachineFiles const& files, TMemoryNamespace& ns) {
  TComputerSystem const system(files);
  auto const functions = PciFunctions(files, system);
  auto const devices = UsbDevices(files, system);

  TRecordWriter writer(ns);
  writer.Write(system.Record());
  WritePci(writer, files, system, functions);
  TiePci(writer, system.Record(), functions);
  WriteSlots(writer, files, functions);
  WriteUsb(writer, files, system, devices);
  TieUsb(writer, system.Record(), devices, functions);
  writer.WriteMissing();
}

}  // namespace NQRVZEP20
