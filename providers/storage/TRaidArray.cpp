// SPDX-License-Identifier: Apache-2.0
#include "TRaidArray.h"

#include "ValueNames.h"

#include <algorithm>
#include <sstream>

namespace NQRVZEP20 {

namespace {

using TText = TFinding<std::string>;
using TCode = TFinding<unsigned short>;
using TCodes = TFinding<std::vector<unsigned short>>;
using TNumber = TFinding<unsigned long>;

constexpr unsigned long kSysfsSector = 512;
constexpr unsigned long kKiB = 1024;

// Values of OperationalStatus and ExtentStatus (ValueNames.h).
constexpr unsigned short kOK = 2, kDegraded = 3, kError = 6, kStopped = 10, kInService = 11;
constexpr unsigned short kNone = 2, kBroken = 3, kReconfiguring = 5, kUnprotected = 9, kRebuild = 11, kRecalculate = 12,
                         kVerify = 14;

TRaidMember MemberOf(TMachineFiles const& files, std::string const& array, std::string const& directory,
                     std::string const& device) {
  auto const inBytes = [](unsigned long unit) { return [unit](unsigned long number) { return number * unit; }; };
  TText const slot = files.Line(directory + "/slot");
  TMissing const noSlot{kMissingNotApplicable, "the device has no place in the array: it failed, or is a spare"};
  return {array,
          device,
          files.Line(directory + "/state"),
          slot && *slot == "none" ? TCode(noSlot) : files.Number<unsigned short>(directory + "/slot"),
          files.Number<unsigned int>(directory + "/errors"),
          files.Number<unsigned long>(directory + "/offset").Then(inBytes(kSysfsSector)),
          files.Number<unsigned long>(directory + "/size").Then(inBytes(kKiB))};
}

// The members are directories such as "dev-sda1".
std::vector<TRaidMember> MembersOf(TMachineFiles const& files, TBlockDevice const& array) {
  std::string const prefix = "dev-";
  std::vector<TRaidMember> members;
  for (std::string const& name : files.Names(array.File("md")))
    if (name.rfind(prefix, 0) == 0)
      members.push_back(MemberOf(files, array.fName, array.File("md/" + name), name.substr(prefix.size())));
  return members;
}

// The copies of the data that the layout of a RAID 10 asks for.
unsigned CopiesFrom(int layout) {
  auto const bits = static_cast<unsigned>(layout);
  return std::max(1U, bits & 255) * std::max(1U, bits >> 8 & 255);
}

// Whether an array of this level may lack members. A container only has the external metadata of other arrays.
bool HasRedundancy(std::string const& level) {
  constexpr char const* kWithout[] = {"raid0", "linear", "multipath", "faulty", "container"};
  return std::find(std::begin(kWithout), std::end(kWithout), level) == std::end(kWithout);
}

// The kernel has the number only of an array that runs.
TCode MissingMembersOf(TMachineFiles const& files, TRaidArray const& array) {
  if (array.fLevel && !HasRedundancy(*array.fLevel))
    return TMissing{kMissingNotApplicable,
                    "an array of the level " + *array.fLevel + " has no redundancy: it cannot lack a member"};
  return files.Number<unsigned short>(array.fDevice.File("md/degraded"));
}

// How many members of a complete array may fail.
TCode CompleteRedundancy(TRaidArray const& array) {
  if (!array.fLevel) return array.fLevel.Why();
  std::string const& level = *array.fLevel;
  auto const number = [](unsigned value) { return TCode(static_cast<unsigned short>(value)); };
  if (level == "raid1") return array.fDisks.Then([](unsigned short disks) { return static_cast<unsigned short>(disks - 1); });
  if (level == "raid4" || level == "raid5") return number(1);
  if (level == "raid6") return number(2);
  if (level == "raid10")
    return array.fLayout.Then([&](int layout) { return static_cast<unsigned short>(CopiesFrom(layout) - 1); });
  return number(0);
}

// The number of complete copies of the data at present.
TCode CopiesOf(TRaidArray const& array) {
  if (array.fLevel && *array.fLevel != "raid1" && *array.fLevel != "raid10") return static_cast<unsigned short>(1);
  return RedundancyOf(array).Then([](unsigned short redundancy) { return static_cast<unsigned short>(redundancy + 1); });
}

bool IsStopped(std::string const& state) { return state == "inactive" || state == "clear" || state == "suspended"; }

TCodes ExtentStatusOf(TRaidArray const& array) {
  if (!array.fState) return array.fState.Why();
  std::vector<unsigned short> codes;
  std::string const action = array.fAction ? *array.fAction : "";
  TCode const redundancy = RedundancyOf(array);
  if (*array.fState == "broken") codes.push_back(kBroken);
  if (array.fDegraded && *array.fDegraded > 0 && redundancy && *redundancy == 0) codes.push_back(kUnprotected);
  if (action == "recover") codes.push_back(kRebuild);
  if (action == "resync" || action == "repair") codes.push_back(kRecalculate);
  if (action == "check") codes.push_back(kVerify);
  if (action == "reshape") codes.push_back(kReconfiguring);
  if (codes.empty()) codes.push_back(kNone);
  return codes;
}

// "mirror" of the name "host:mirror" that mdadm stores.
TText NameOf(TRaidArray const& array, TUdevRecord const& udev) {
  TText const name = udev.Value("MD_NAME");
  return name ? name : TText(array.fDevice.fName);
}

// "367bd78f:7b25eb3a:41037dca:dc6dfaec", as mdadm writes it, of the kernel's "367bd78f-7b25-eb3a-4103-7dcadc6dfaec".
TText UuidFrom(std::string const& text) {
  std::string digits = text;
  digits.erase(std::remove(digits.begin(), digits.end(), '-'), digits.end());
  if (digits.size() != 32) return TMissing{kMissingNotGiven, "the metadata of the array have no UUID"};
  return digits.substr(0, 8) + ":" + digits.substr(8, 8) + ":" + digits.substr(16, 8) + ":" + digits.substr(24);
}

TText UuidOf(TMachineFiles const& files, TRaidArray const& array, TUdevRecord const& udev) {
  TText const uuid = udev.Value("MD_UUID");
  return uuid ? uuid : files.Line(array.fDevice.File("md/uuid")).Then(UuidFrom);
}

// The members whose state contains the word.
unsigned short Count(TRaidArray const& array, char const* word) {
  auto const has = [&](TRaidMember const& member) { return member.fState && member.fState->find(word) != std::string::npos; };
  return static_cast<unsigned short>(std::count_if(array.fMembers.begin(), array.fMembers.end(), has));
}

TNumber ChunkSizeOf(TMachineFiles const& files, TRaidArray const& array) {
  return files.Number<unsigned long>(array.fDevice.File("md/chunk_size")).Then([](unsigned long size) -> TNumber {
    if (size == 0) return TMissing{kMissingNotApplicable, "an array of this level has no chunks"};
    return size;
  });
}

}  // namespace

TRaidArray RaidArrayOf(TMachineFiles const& files, TBlockDevice const& device) {
  TRaidArray array;
  array.fDevice = device;
  array.fLevel = files.Line(device.File("md/level"));
  array.fState = files.Line(device.File("md/array_state"));
  array.fAction = files.Line(device.File("md/sync_action"));
  array.fDisks = files.Number<unsigned short>(device.File("md/raid_disks"));
  array.fDegraded = MissingMembersOf(files, array);
  array.fLayout = files.Number<int>(device.File("md/layout"));
  array.fMembers = MembersOf(files, device);
  return array;
}

TCode RedundancyOf(TRaidArray const& array) {
  return CompleteRedundancy(array).Then([&](unsigned short redundancy) -> TCode {
    if (redundancy == 0) return redundancy;
    return array.fDegraded.Then(
        [&](unsigned short lacking) { return static_cast<unsigned short>(redundancy - std::min(redundancy, lacking)); });
  });
}

TFinding<TVolumeStatus> StatusOf(TRaidArray const& array) {
  return array.fState.Then([&](std::string const& state) {
    TVolumeStatus status;
    if (IsStopped(state))
      status.Add(kStopped, state);
    else if (state == "broken")
      status.Add(kError, state);
    else if (array.fDegraded && *array.fDegraded > 0)
      status.Add(kDegraded, state + ", degraded: " + std::to_string(*array.fDegraded) + " of " +
                                (array.fDisks ? std::to_string(*array.fDisks) : "the") + " members missing");
    else
      status.Add(kOK, state);
    if (array.fAction && *array.fAction != "idle" && *array.fAction != "frozen") status.Add(kInService, *array.fAction);
    return status;
  });
}

TFinding<unsigned char> ProgressFrom(std::string const& text) {
  std::istringstream numbers(text);
  unsigned long done = 0, all = 0;
  char slash = 0;
  if (text == "none") return TMissing{kMissingNotApplicable, "the array is not being synchronised"};
  if (!(numbers >> done >> slash >> all) || slash != '/' || all == 0 || done > all)
    return TMissing{kMissingUnexpected, "\"" + text + "\" is not the progress of a synchronisation"};
  return static_cast<unsigned char>(100.0 * static_cast<double>(done) / static_cast<double>(all));
}

TRecord RaidArrayRecord(TMachineFiles const& files, TRaidArray const& array, TUdevRecord const& udev,
                        TComputerSystem const& system) {
  TBlockDevice const& device = array.fDevice;
  TCode const redundancy = RedundancyOf(array);
  TText const uuid = UuidOf(files, array, udev);
  TIdentifiers names;
  names.Add("RAID UUID", uuid);
  TRecord record =
      VolumeRecord("ZEP_RaidArray", files, device, system, NameOf(array, udev), names, StatusOf(array), "CIM_StorageVolume");
  record.Add("ExtentStatus", ExtentStatusOf(array)).Names(kExtentStatusNames);
  record.Add("NoSinglePointOfFailure", redundancy.Then([](unsigned short number) { return number > 0; }));
  record.Add("PackageRedundancy", redundancy);
  record.Add("DataRedundancy", CopiesOf(array));
  record.Add("Level", array.fLevel);
  record.Add("State", array.fState);
  record.Add("Members", array.fDisks);
  record.Add("MissingMembers", array.fDegraded);
  record.Add("FailedMembers", TCode(Count(array, "faulty")));
  record.Add("SpareMembers", TCode(Count(array, "spare")));
  record.Add("Action", array.fAction);
  record.Add("Progress", files.Line(device.File("md/sync_completed")).Then(ProgressFrom)).Unit("percent");
  record.Add("Mismatches", files.Number<unsigned long>(device.File("md/mismatch_cnt")));
  record.Add("ChunkSize", ChunkSizeOf(files, array)).Unit("byte");
  record.Add("Layout", array.fLayout);
  record.Add("ConsistencyPolicy", files.Line(device.File("md/consistency_policy")));
  record.Add("MetadataVersion", files.Line(device.File("md/metadata_version")));
  record.Add("UUID", uuid);
  return record;
}

TRecord RaidMemberRecord(TRaidMember const& member) {
  TRecord record("ZEP_RaidMember", "sysfs", "CIM_StatisticalData");
  record.AddKey("InstanceID", "ZEP:raid:" + member.fArray + ":" + member.fDevice);
  record.Add("ElementName", TText(member.fDevice));
  record.Add("Array", TText(member.fArray));
  record.Add("State", member.fState);
  record.Add("Slot", member.fSlot);
  record.Add("Errors", member.fErrors);
  record.Add("DataOffset", member.fOffset).Unit("byte");
  record.Add("DataSize", member.fSize).Unit("byte");
  return record;
}

}  // namespace NQRVZEP20
