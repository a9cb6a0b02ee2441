// SPDX-License-Identifier: Apache-2.0
#include "TStorage.h"
#include "VolumeGroups.h"

#include <algorithm>

namespace NQRVZEP20 {

namespace {

constexpr TAssociation kHosted{"CIM_HostedStoragePool", "GroupComponent", "CIM_System", "PartComponent", "CIM_StoragePool"};
constexpr TAssociation kComponent{"CIM_ConcreteComponent", "GroupComponent", "CIM_ManagedElement", "PartComponent",
                                  "CIM_ManagedElement"};
constexpr TAssociation kAllocated{"CIM_AllocatedFromStoragePool", "Antecedent", "CIM_StoragePool", "Dependent",
                                  "CIM_LogicalElement"};

bool IsMember(TVolumeGroup const& group, TKnownDevice const& known) {
  auto const& numbers = group.fMemberNumbers;
  return known.fNumber && std::find(numbers.begin(), numbers.end(), *known.fNumber) != numbers.end();
}

// The devices that the group consists of, and the volumes in it.
void TieDevices(TStorage& storage, TVolumeGroup const& group, TRecord const& pool) {
  for (TKnownDevice const& known : storage.fDevices) {
    auto const extent = storage.fExtents.find(known.fDevice.fName);
    if (extent == storage.fExtents.end()) continue;
    if (IsMember(group, known)) storage.fWriter.Associate(kComponent, pool, extent->second);
    if (GroupOfVolume(storage.fFiles, known.fDevice) == group.fUuid) storage.fWriter.Associate(kAllocated, pool, extent->second);
  }
}

}  // namespace

void WritePools(TStorage& storage) {
  auto const groups = VolumeGroupsOf(storage.fFiles, storage.fDevices);
  std::vector<TRecord> pools;
  for (TVolumeGroup const& group : groups) pools.push_back(PoolRecord(group));
  storage.fWriter.Write(PoolRecord(TVolumeGroup()), pools, {kMissingNotGiven, "no device belongs to a volume group of LVM"});
  for (std::size_t at = 0; at < pools.size(); ++at) {
    storage.fWriter.Associate(kHosted, storage.fSystemRecord, pools[at]);
    TieDevices(storage, groups[at], pools[at]);
  }
}

}  // namespace NQRVZEP20
