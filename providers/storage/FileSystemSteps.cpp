// SPDX-License-Identifier: Apache-2.0
#include "FileSystemRecords.h"
#include "TStorage.h"

namespace NQRVZEP20 {

namespace {

constexpr char const* kMountFile = "/proc/self/mountinfo";
constexpr char const* kSwapFile = "/proc/swaps";

constexpr TAssociation kHosted{"CIM_HostedFileSystem", "GroupComponent", "CIM_System", "PartComponent", "CIM_FileSystem"};
constexpr TAssociation kResides{"CIM_ResidesOnExtent", "Antecedent", "CIM_StorageExtent", "Dependent", "CIM_LogicalElement"};
constexpr TAssociation kSettings{"CIM_ElementSettingData", "ManagedElement", "CIM_ManagedElement", "SettingData",
                                 "CIM_SettingData"};
constexpr TAssociation kComponent{"CIM_SystemComponent", "GroupComponent", "CIM_System", "PartComponent",
                                  "CIM_ManagedSystemElement"};

struct TDescribed {
  TFileSystem const* fFileSystem;
  TRecord fRecord;
};

std::vector<TRecord> RecordsOf(std::vector<TDescribed> const& described) {
  std::vector<TRecord> records;
  for (TDescribed const& one : described) records.push_back(one.fRecord);
  return records;
}

void AssociateExtent(TStorage& storage, std::string const& device, TRecord const& content) {
  auto const extent = storage.fExtents.find(device);
  if (extent != storage.fExtents.end()) storage.fWriter.Associate(kResides, extent->second, content);
}

void AssociateFileSystem(TStorage& storage, TDescribed const& described) {
  storage.fWriter.Associate(kHosted, storage.fSystemRecord, described.fRecord);
  AssociateExtent(storage, described.fFileSystem->fDevice, described.fRecord);
  for (TMount const& mount : described.fFileSystem->fMounts)
    storage.fWriter.Associate(kSettings, described.fRecord, MountRecord(mount));
}

void WriteSwapAreas(TStorage& storage, TFinding<std::string> const& text) {
  TMissing const whyNone = text ? TMissing{kMissingNotGiven, std::string(kSwapFile) + " lists no swap area in use"} : text.Why();
  std::vector<TRecord> records;
  std::vector<TSwap> const swaps = SwapsFrom(text ? *text : "");
  for (TSwap const& swap : swaps) records.push_back(SwapRecord(swap));
  storage.fWriter.Write(SwapRecord(TSwap{}), records, whyNone);
  for (TRecord const& record : records) storage.fWriter.Associate(kComponent, storage.fSystemRecord, record);
  for (TKnownDevice const& known : storage.fDevices)
    for (std::size_t i = 0; i < swaps.size(); ++i)
      if (known.fDevice.Node() == swaps[i].fFile) AssociateExtent(storage, known.fDevice.fName, records[i]);
}

}  // namespace

void WriteFileSystems(TStorage& storage) {
  auto const text = storage.fFiles.Content(kMountFile);
  std::vector<TFileSystem> const fileSystems = FileSystemsOf(MountsFrom(text ? *text : ""), storage.fDevices);
  std::vector<TDescribed> local, remote;
  std::vector<TRecord> mounts;
  for (TFileSystem const& system : fileSystems) {
    if (system.fPlace == TFileSystem::kElsewhere)
      remote.push_back({&system, RemoteFileSystemRecord(system, storage.fSystemRecord)});
    else
      local.push_back({&system, LocalFileSystemRecord(storage.fFiles, system, storage.fSystemRecord)});
    for (TMount const& mount : system.fMounts) mounts.push_back(MountRecord(mount));
  }

  TMissing const whyNone = text ? TMissing{kMissingNotGiven, std::string(kMountFile) + " lists no such file system"} : text.Why();
  TFileSystem const shape;
  storage.fWriter.Write(LocalFileSystemRecord(storage.fFiles, shape, storage.fSystemRecord), RecordsOf(local), whyNone);
  storage.fWriter.Write(RemoteFileSystemRecord(shape, storage.fSystemRecord), RecordsOf(remote), whyNone);
  storage.fWriter.Write(MountRecord(TMount()), mounts, whyNone);
  for (TDescribed const& one : local) AssociateFileSystem(storage, one);
  for (TDescribed const& one : remote) AssociateFileSystem(storage, one);
  WriteSwapAreas(storage, storage.fFiles.Content(kSwapFile));
}

}  // namespace NQRVZEP20
