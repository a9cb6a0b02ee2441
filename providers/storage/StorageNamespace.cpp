// SPDX-License-Identifier: Apache-2.0
#include "StorageNamespace.h"

#include "ProgramOutput.h"
#include "TStorage.h"
#include "providers/memory/TMemoryNamespace.h"

#include <unistd.h>

namespace NQRVZEP20 {

namespace {

using TTime = std::chrono::steady_clock::time_point;

constexpr auto kProbeLimit = std::chrono::seconds(3);  // for all devices together

TFinding<std::string> AskBlkid(std::string const& node, TTime deadline) {
  if (::geteuid() != 0) return TMissing{kMissingNeedsRoot, "only root may read " + node};
  static std::string const program = FindProgram("blkid");
  if (program.empty()) return TMissing{kMissingUnreadable, "the program blkid is not installed"};
  return OutputOf(program, {"-p", "-o", "udev", node}, deadline);
}

// Without a record of udev, as in a container, blkid reads what is on the device. It runs as a process of its own, so that a disk
// that does not answer does not hold up this one. Drives whose medium can be removed are not read.
TUdevRecord RecordOf(TMachineFiles const& files, TBlockDevice const& device, TFinding<std::string> const& number,
                     TTime deadline) {
  TUdevRecord const ofUdev = TUdevRecord::Of(files, number);
  bool const isReadable =
      device.fKind != TBlockDevice::kOptical && device.fKind != TBlockDevice::kDiskette && SizeOf(files, device);
  if (ofUdev.Exists() || !isReadable) return ofUdev;
  auto const answer = files.Answer("blkid/" + device.fName, [&] { return AskBlkid(device.Node(), deadline); });
  return answer ? TUdevRecord::FromBlkid(*answer) : ofUdev;
}

std::vector<TKnownDevice> KnownDevicesOf(TMachineFiles const& files) {
  TTime const deadline = std::chrono::steady_clock::now() + kProbeLimit;
  std::vector<TKnownDevice> known;
  for (TBlockDevice const& device : BlockDevicesOf(files)) {
    TFinding<std::string> const number = NumberOf(files, device);
    known.push_back({device, RecordOf(files, device, number, deadline), number});
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
  WritePools(storage);
  WriteBlockDevices(storage);
  WriteFileSystems(storage);
  storage.fWriter.WriteMissing();
}

}  // namespace NQRVZEP20
