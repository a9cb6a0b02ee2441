// SPDX-License-Identifier: Apache-2.0
#include "StorageNamespace.h"

#include "TStorage.h"
#include "providers/memory/TMemoryNamespace.h"

namespace NQRVZEP20 {

namespace {

std::vector<TKnownDevice> KnownDevicesOf(TMachineFiles const& files) {
  std::vector<TKnownDevice> known;
  for (TBlockDevice const& device : BlockDevicesOf(files)) {
    TFinding<std::string> const number = NumberOf(files, device);
    known.push_back({device, TUdevRecord::Of(files, number), number});
  }
  return known;
}

std::vector<TDisk> DisksOf(TMachineFiles const& files, std::vector<TKnownDevice> const& devices) {
  std::vector<TDisk> disks;
  for (TKnownDevice const& known : devices)
    if (known.fDevice.IsDrive()) disks.push_back(DiskOf(files, known.fDevice, known.fUdev));
  for (TBlockDevice const& drive : TapeDrivesOf(files))
    disks.push_back(DiskOf(files, drive, TUdevRecord(TMissing{kMissingNotApplicable, "a tape drive is not a block device"})));
  return disks;
}

}  // namespace

TStorage::TStorage(TMemoryNamespace& ns, TMachineFiles const& files)
    : fFiles(files),
      fSystem(files),
      fSystemRecord(fSystem.Record()),
      fWriter(ns),
      fDevices(KnownDevicesOf(files)),
      fDisks(DisksOf(files, fDevices)),
      fControllers(ControllersOf(fDisks)),
      fHealth(HealthOf(files, fDisks)),
      fNoDisk(DiskOf(files, TBlockDevice(), TUdevRecord(TMissing()))) {}

void FillStorageNamespace(TMemoryNamespace& ns, TMachineFiles const& files) {
  TStorage storage(ns, files);
  storage.fWriter.Write(storage.fSystemRecord);
  WriteDrives(storage);
  WriteControllersAndSlots(storage);
  WriteHealth(storage);
  WriteExtents(storage);
  WriteVolumes(storage);
  WriteBlockDevices(storage);
  WriteFileSystems(storage);
  storage.fWriter.WriteMissing();
}

}  // namespace NQRVZEP20
