// SPDX-License-Identifier: Apache-2.0
#include "VolumeRecords.h"

#include "ExtentRecords.h"
#include "ValueNames.h"
#include "providers/reasons/OperationalStatusNames.h"

namespace NQRVZEP20 {

namespace {

using TText = TFinding<std::string>;

// Values of OperationalStatus (ValueNames.h).
constexpr unsigned short kOK = 2, kDegraded = 3, kStopped = 10;

TText MappedName(TMachineFiles const& files, TBlockDevice const& device) {
  TText const uuid = files.Line(device.File("dm/uuid"));
  return files.Line(device.File("dm/name")).Then([&](std::string const& name) {
    return MappedNameFrom(name, uuid ? *uuid : "");
  });
}

TIdentifiers MappedNames(TMachineFiles const& files, TBlockDevice const& device) {
  TIdentifiers names;
  names.Add("Device mapper name", files.Line(device.File("dm/name")));
  names.Add("Device mapper UUID", files.Line(device.File("dm/uuid")));
  return names;
}

// The paths of a multipath device that cannot be used at present, and the number of all.
struct TPaths {
  std::size_t fAll, fFailed;
};

TPaths PathsOf(TMachineFiles const& files, TBlockDevice const& device) {
  std::vector<std::string> const below = DevicesBelow(files, device);
  TPaths paths{below.size(), 0};
  for (std::string const& name : below) {
    TText const state = files.Line("/sys/class/block/" + name + "/device/state");
    if (state && *state != "running" && *state != "live") ++paths.fFailed;
  }
  return paths;
}

TFinding<TVolumeStatus> MappedStatus(TMachineFiles const& files, TBlockDevice const& device) {
  TText const uuid = files.Line(device.File("dm/uuid"));
  return files.Number<int>(device.File("dm/suspended")).Then([&](int isSuspended) {
    TVolumeStatus status;
    TPaths const paths = uuid && uuid->rfind("mpath-", 0) == 0 ? PathsOf(files, device) : TPaths{0, 0};
    if (isSuspended != 0)
      status.Add(kStopped, "suspended");
    else if (paths.fFailed > 0)
      status.Add(kDegraded, std::to_string(paths.fFailed) + " of " + std::to_string(paths.fAll) + " paths cannot be used");
    else
      status.Add(kOK, "active");
    return status;
  });
}

}  // namespace

std::string MappedNameFrom(std::string const& name, std::string const& uuid) {
  if (uuid.rfind("LVM-", 0) != 0) return name;
  std::string text;
  bool hasGroup = false;
  for (std::size_t i = 0; i < name.size(); ++i) {
    bool const isDoubled = name.compare(i, 2, "--") == 0;
    bool const isBetween = name[i] == '-' && !isDoubled && !hasGroup;
    text += isBetween ? '/' : name[i];
    hasGroup = hasGroup || isBetween;
    if (isDoubled) ++i;
  }
  return text;
}

std::vector<std::string> DevicesBelow(TMachineFiles const& files, TBlockDevice const& device) {
  return files.Names(device.File("slaves"));
}

TRecord VolumeRecord(char const* className, TMachineFiles const& files, TBlockDevice const& device, TComputerSystem const& system,
                     TText const& elementName, TIdentifiers const& names, TFinding<TVolumeStatus> const& status,
                     std::string const& superClass) {
  TRecord record = ExtentRecord(className, files, device, system, elementName, superClass);
  TMissing const noName{kMissingNotGiven, "the volume has no other name"};
  record.Add("OtherIdentifyingInfo", names.Values(noName));
  record.Add("IdentifyingDescriptions", names.Descriptions(noName));
  record.Add("OperationalStatus", status.Then([](TVolumeStatus const& state) { return state.fCodes; }))
      .Names(kOperationalStatusNames);
  record.Add("StatusDescriptions", status.Then([](TVolumeStatus const& state) { return state.fTexts; }));
  return record;
}

TRecord MappedVolumeRecord(TMachineFiles const& files, TBlockDevice const& device, TComputerSystem const& system) {
  return VolumeRecord("CIM_StorageVolume", files, device, system, MappedName(files, device), MappedNames(files, device),
                      MappedStatus(files, device));
}

}  // namespace NQRVZEP20
