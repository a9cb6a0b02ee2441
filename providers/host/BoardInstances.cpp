// SPDX-License-Identifier: Apache-2.0
#include "BoardInstances.h"

#include "BoardRecords.h"
#include "SmbiosFields.h"
#include "providers/reasons/TRecordWriter.h"

#include <algorithm>

namespace NQRVZEP20 {

namespace {

constexpr TAssociation kSystemPackage{"CIM_ComputerSystemPackage", "Antecedent", "CIM_PhysicalPackage", "Dependent",
                                      "CIM_ComputerSystem"};
constexpr TAssociation kMemoryOnCard{"CIM_MemoryOnCard", "GroupComponent", "CIM_Card", "PartComponent", "CIM_PhysicalMemory"};
constexpr TAssociation kContainer{"CIM_Container", "GroupComponent", "CIM_PhysicalPackage", "PartComponent",
                                  "CIM_PhysicalElement"};
constexpr TAssociation kCapacity{"CIM_ElementCapacity", "Capacity", "CIM_PhysicalCapacity", "Element", "CIM_PhysicalElement"};

using TRecords = std::vector<TStructureRecord>;

bool Contains(std::vector<std::uint16_t> const& handles, TFinding<std::uint16_t> const& handle) {
  return handle && std::find(handles.begin(), handles.end(), *handle) != handles.end();
}

// A board lists the handles of what is on it: of the modules themselves, or of their array.
void TieMemory(THostContext const& host, TRecords const& boards, TRecords const& arrays, TRecords const& modules) {
  constexpr std::size_t arrayHandle = 0x04;  // of a memory module
  for (TStructureRecord const& board : boards) {
    auto const handles = HandlesOn(board.fStructure);
    for (TStructureRecord const& module : modules)
      if (Contains(handles, module.fStructure.Handle()) || Contains(handles, module.fStructure.Word(arrayHandle)))
        host.fWriter.Associate(kMemoryOnCard, board.fRecord, module.fRecord);
    for (TStructureRecord const& array : arrays)
      if (Contains(handles, array.fStructure.Handle())) host.fWriter.Associate(kCapacity, array.fRecord, board.fRecord);
  }
}

// A board names the handle of its chassis, and its place there.
void TieChassis(THostContext const& host, TRecords const& boards, TRecords const& allChassis) {
  constexpr std::size_t location = 0x0a, chassisHandle = 0x0b;  // of a board
  for (TStructureRecord const& board : boards) {
    TRecord place("CIM_Container", host.fTables.SourceOf(kSmbiosBoard));
    place.Add("LocationWithinContainer", TextOf(board.fStructure, location));
    for (TStructureRecord const& chassis : allChassis)
      if (auto const handle = chassis.fStructure.Handle(); handle && IsNumber(board.fStructure.Word(chassisHandle), *handle))
        host.fWriter.Associate(kContainer, chassis.fRecord, board.fRecord, place);
  }
}

// Writes a class with a record of each structure of that type.
template <class TMakeRecord>
TRecords WriteAll(THostContext const& host, int type, TMakeRecord makeRecord) {
  return WriteEach(host, type, IsAlwaysPresent, "", [&](TSmbiosStructure const& structure, unsigned number) {
    return makeRecord(structure, host.fTables.SourceOf(type), number);
  });
}

}  // namespace

void WriteBoards(THostContext const& host, std::vector<TStructureRecord> const& chassis,
                 std::vector<TStructureRecord> const& modules) {
  auto const boards = WriteAll(host, kSmbiosBoard, BoardRecord);
  for (TStructureRecord const& board : boards) host.fWriter.Associate(kSystemPackage, board.fRecord, host.fSystem);
  TieChassis(host, boards, chassis);
  WriteAll(host, kSmbiosSlot, SlotRecord);
  TieMemory(host, boards, WriteAll(host, kSmbiosMemoryArray, MemoryArrayRecord), modules);
  WriteAll(host, kSmbiosOnboardDevice, OnboardDeviceRecord);

  auto const interfaces =
      WriteAll(host, kSmbiosIpmi, [&](TSmbiosStructure const& interface, std::string const& source, unsigned number) {
        return IpmiRecord(interface, source, number, host.fName);
      });
  for (TStructureRecord const& interface : interfaces) host.fWriter.Associate(kSystemDevice, host.fSystem, interface.fRecord);
}

}  // namespace NQRVZEP20
