// SPDX-License-Identifier: Apache-2.0
#include "VolumeGroups.h"

#include "ProgramOutput.h"
#include "VolumeRecords.h"

#include <nlohmann/json.hpp>

#include <unistd.h>

#include <algorithm>
#include <charconv>

namespace NQRVZEP20 {

namespace {

using TJson = nlohmann::json;

// lvm writes every value as text.
std::string TextIn(TJson const& row, char const* name) {
  auto const found = row.is_object() ? row.find(name) : row.end();
  return found != row.end() && found->is_string() ? found->get<std::string>() : "";
}

TFinding<std::uint64_t> BytesIn(TJson const& row, char const* name) {
  std::string const text = TextIn(row, name);
  std::uint64_t bytes = 0;
  auto const [end, error] = std::from_chars(text.data(), text.data() + text.size(), bytes);
  if (error == std::errc() && end == text.data() + text.size()) return bytes;
  return TMissing{kMissingUnexpected, "lvm reports \"" + text + "\", which is not a number of bytes"};
}

std::string WithoutHyphens(std::string uuid) {
  uuid.erase(std::remove(uuid.begin(), uuid.end(), '-'), uuid.end());
  return uuid;
}

// The group with that UUID, which is added if it is new.
TVolumeGroup& GroupIn(std::vector<TVolumeGroup>& groups, std::string const& uuid) {
  for (TVolumeGroup& group : groups)
    if (group.fUuid == uuid) return group;
  groups.emplace_back();
  groups.back().fUuid = uuid;
  return groups.back();
}

// A row describes a device and its group.
void AddRow(std::vector<TVolumeGroup>& groups, TJson const& row) {
  std::string const uuid = WithoutHyphens(TextIn(row, "vg_uuid")), name = TextIn(row, "vg_name");
  if (uuid.empty() || name.empty()) return;
  TVolumeGroup& group = GroupIn(groups, uuid);
  group.fName = name;
  group.fSize = BytesIn(row, "vg_size");
  group.fFree = BytesIn(row, "vg_free");
  group.fMemberNumbers.push_back(TextIn(row, "pv_major") + ":" + TextIn(row, "pv_minor"));
}

TFinding<std::string> AskLvm() {
  if (::geteuid() != 0) return TMissing{kMissingNeedsRoot, "only root may ask lvm"};
  std::string const program = FindProgram("lvm");
  if (program.empty()) return TMissing{kMissingUnreadable, "the program lvm is not installed; it is part of the package lvm2"};
  return OutputOf(program, VolumeGroupArguments(), std::chrono::steady_clock::now() + std::chrono::seconds(2));
}

bool IsOfLvm(TMachineFiles const& files, TKnownDevice const& known) {
  auto const type = known.fUdev.Value("ID_FS_TYPE");
  return (type && *type == "LVM2_member") || !GroupOfVolume(files, known.fDevice).empty();
}

// The groups of the volumes, of which only the name is known.
std::vector<TVolumeGroup> GroupsOfVolumes(TMachineFiles const& files, std::vector<TKnownDevice> const& devices,
                                          TMissing const& why) {
  std::vector<TVolumeGroup> groups;
  for (TKnownDevice const& known : devices) {
    std::string const uuid = GroupOfVolume(files, known.fDevice);
    if (uuid.empty()) continue;
    TVolumeGroup& group = GroupIn(groups, uuid);
    group.fName = files.Line(known.fDevice.File("dm/name")).Then([](std::string const& name) {
      std::string const mapped = MappedNameFrom(name, "LVM-");
      return mapped.substr(0, mapped.find('/'));
    });
    group.fSize = group.fFree = why;
  }
  return groups;
}

}  // namespace

std::vector<std::string> VolumeGroupArguments() {
  return {"pvs",        "--readonly", "--reportformat",
          "json",       "--units",    "b",
          "--nosuffix", "-o",         "vg_name,vg_uuid,vg_size,vg_free,pv_major,pv_minor"};
}

std::vector<TVolumeGroup> VolumeGroupsFrom(std::string const& answer) {
  TJson const json = TJson::parse(answer, nullptr, false);
  std::vector<TVolumeGroup> groups;
  auto const reports = json.is_object() ? json.find("report") : json.end();
  if (reports == json.end() || !reports->is_array()) return groups;
  for (TJson const& report : *reports)
    if (auto const rows = report.is_object() ? report.find("pv") : report.end(); rows != report.end() && rows->is_array())
      for (TJson const& row : *rows) AddRow(groups, row);
  return groups;
}

std::vector<TVolumeGroup> VolumeGroupsOf(TMachineFiles const& files, std::vector<TKnownDevice> const& devices) {
  auto const isOfLvm = [&](TKnownDevice const& known) { return IsOfLvm(files, known); };
  if (std::none_of(devices.begin(), devices.end(), isOfLvm)) return {};
  auto const answer = files.Answer("lvm/pvs", AskLvm);
  if (!answer) return GroupsOfVolumes(files, devices, answer.Why());
  auto const groups = VolumeGroupsFrom(*answer);
  if (!groups.empty()) return groups;
  return GroupsOfVolumes(files, devices, {kMissingUnexpected, "lvm reports no volume group"});
}

std::string GroupOfVolume(TMachineFiles const& files, TBlockDevice const& device) {
  constexpr std::size_t prefixSize = 4, uuidSize = 32;
  if (device.fKind != TBlockDevice::kMapped) return "";
  auto const uuid = files.Line(device.File("dm/uuid"));
  return uuid && uuid->rfind("LVM-", 0) == 0 && uuid->size() >= prefixSize + uuidSize ? uuid->substr(prefixSize, uuidSize) : "";
}

TRecord PoolRecord(TVolumeGroup const& group) {
  TRecord record("CIM_StoragePool", "lvm");
  record.AddKey("InstanceID", "ZEP:pool:" + group.fUuid);
  record.Add("ElementName", group.fName);
  record.Add("PoolID", group.fName);
  record.AddOwn("Primordial", TCIMValue(false));
  record.Add("TotalManagedSpace", group.fSize).Unit("byte");
  record.Add("RemainingManagedSpace", group.fFree).Unit("byte");
  return record;
}

}  // namespace NQRVZEP20
