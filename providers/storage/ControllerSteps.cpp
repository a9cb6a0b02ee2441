// SPDX-License-Identifier: Apache-2.0
#include "Controllers.h"
#include "TStorage.h"

namespace NQRVZEP20 {

namespace {

constexpr TAssociation kControlledBy{"CIM_ControlledBy", "Antecedent", "CIM_Controller", "Dependent", "CIM_LogicalDevice"};
constexpr TAssociation kRealizes{"CIM_Realizes", "Antecedent", "CIM_PhysicalElement", "Dependent", "CIM_LogicalDevice"};
constexpr TAssociation kInSlot{"CIM_PackageInSlot", "Antecedent", "CIM_Slot", "Dependent", "CIM_PhysicalPackage"};

void WriteControllers(TStorage& storage, std::vector<TController> const& controllers) {
  std::vector<TRecord> records;
  for (TController const& controller : controllers)
    records.push_back(ControllerRecord(storage.fFiles, controller, storage.fSystem));
  storage.fWriter.Write(ControllerRecord(storage.fFiles, TController{"", "/sys/devices/none"}, storage.fSystem), records,
                        {kMissingNotGiven, "no drive is attached through PCI"});
  for (std::size_t i = 0; i < records.size(); ++i) {
    storage.fWriter.Associate(kSystemDevice, storage.fSystemRecord, records[i]);
    for (std::string const& drive : controllers[i].fDrives)
      storage.fWriter.Associate(kControlledBy, records[i], storage.fDrives.at(drive));
    TController const& controller = controllers[i];
    TRecord const& package =
        controller.IsNvme() ? storage.fPackages.at(controller.fDrives[0]) : storage.fPackages.at(controller.fAddress);
    storage.fWriter.Associate(kRealizes, package, records[i]);
  }
}

void WriteSlots(TStorage& storage, std::vector<TController> const& controllers) {
  TStorage::TByName slots;
  std::vector<std::pair<std::string, TRecord const*>> contents;  // the packages in each slot
  for (TController const& controller : controllers) {
    TFinding<std::string> const slot = SlotOf(storage.fFiles, controller);
    if (!slot) continue;
    slots.emplace(*slot, SlotRecord(storage.fFiles, *slot));
    contents.emplace_back(*slot, &storage.fPackages.at(controller.IsNvme() ? controller.fDrives[0] : controller.fAddress));
  }
  std::vector<TRecord> records;
  for (auto const& [name, record] : slots) records.push_back(record);
  storage.fWriter.Write(SlotRecord(storage.fFiles, ""), records,
                        {kMissingNotGiven, "no controller of a drive is in a slot that the kernel lists in /sys/bus/pci/slots"});
  for (auto const& [slot, package] : contents) storage.fWriter.Associate(kInSlot, slots.at(slot), *package);
}

}  // namespace

void WriteControllersAndSlots(TStorage& storage) {
  WriteControllers(storage, storage.fControllers);
  WriteSlots(storage, storage.fControllers);
}

}  // namespace NQRVZEP20
