// SPDX-License-Identifier: Apache-2.0
#include "collect/findings/Rules.h"

#include <algorithm>

namespace NQRVZEP20 {

namespace {

constexpr char const* kReplaceDisk = "Save the data of this disk and replace it.";

void AskFailingDisk(TRuleRun& run) {
  constexpr std::uint64_t healthy = 5, degraded = 10;  // degraded: by its temperature alone
  for (TElement const& disk : run.Elements("CIM_DiskDrive")) {
    auto const state = disk.Number("HealthState");
    if (!run.Know(disk, state) || *state.fValue == healthy) continue;
    if (*state.fValue == degraded)
      run.Add(disk, state.fSource, ESeverity::kWarning,
              "the disk " + disk.NameIn("DeviceID") + " reports a temperature out of its range (SMART)",
              "Check the fans, the air flow and the temperature of the room.");
    else
      run.Add(disk, state.fSource, ESeverity::kCritical,
              "the disk " + disk.NameIn("DeviceID") + " reports that it is failing (SMART)", kReplaceDisk);
  }
}

// The states that the kernel gives to a device that it can no longer use.
bool IsLost(std::vector<std::string> const& status) {
  constexpr char const *kError = "6", *kNoContact = "12", *kLostCommunication = "13";
  return std::any_of(status.begin(), status.end(),
                     [&](std::string const& code) { return code == kError || code == kNoContact || code == kLostCommunication; });
}

void AskLostDisk(TRuleRun& run) {
  for (TElement const& disk : run.Elements("CIM_DiskDrive")) {
    auto const status = disk.Texts("OperationalStatus");
    if (!status.IsKnown()) continue;  // many virtual disks have no state
    run.Know(disk, status);
    if (!IsLost(*status.fValue)) continue;
    auto const words = disk.Texts("StatusDescriptions");
    std::string const word = words.IsKnown() && !words.fValue->empty() ? " (" + words.fValue->front() + ")" : "";
    run.Add(disk, status.fSource, ESeverity::kError, "the kernel cannot use the disk " + disk.NameIn("DeviceID") + word,
            "Check its cable, backplane and power; look in the kernel's log for the first error of the disk.");
  }
}

std::string DiskOf(TElement const& health) { return "the disk " + health.NameIn("Disk"); }

void AskWornDisk(TRuleRun& run) {
  for (TElement const& health : run.Elements("ZEP_DiskHealth")) {
    auto const used = health.Number("PercentageUsed"), spare = health.Number("AvailableSpare"),
               spareLimit = health.Number("AvailableSpareThreshold");
    if (!used.IsKnown() && !spare.IsKnown()) continue;  // a disk without such a counter, such as one that rotates
    run.Know(health, used.IsKnown() ? used : spare);
    if (spare.IsKnown() && spareLimit.IsKnown() && *spare.fValue < *spareLimit.fValue)
      run.Add(health, spare.fSource, ESeverity::kError,
              DiskOf(health) + " has only " + std::to_string(*spare.fValue) + " % of its spare blocks left", kReplaceDisk);
    if (used.IsKnown() && *used.fValue >= run.Thresholds().fDiskUsedPercent)
      run.Add(health, used.fSource, ESeverity::kWarning,
              DiskOf(health) + " has used " + std::to_string(*used.fValue) + " % of its expected life", "Plan its replacement.");
  }
}

struct TCounter {
  char const* fProperty;
  char const* fWords;
};

void AskBadSectors(TRuleRun& run) {
  constexpr TCounter counters[] = {{"PendingSectors", "unreadable sectors"}, {"UncorrectableErrors", "uncorrected errors"}};
  for (TElement const& health : run.Elements("ZEP_DiskHealth")) {
    for (auto const& [property, words] : counters) {
      auto const count = health.Number(property);
      if (!count.IsKnown()) continue;  // which counters there are depends on the disk
      run.Know(health, count);
      if (*count.fValue > 0)
        run.Add(health, count.fSource, ESeverity::kError, DiskOf(health) + " has " + words + ": " + std::to_string(*count.fValue),
                "Save the data of this disk, test it (smartctl -t long), and replace it if the number grows.");
    }
    auto const reallocated = health.Number("ReallocatedSectors");
    if (!reallocated.IsKnown()) continue;
    run.Know(health, reallocated);
    if (*reallocated.fValue > run.Thresholds().fReallocatedSectors)
      run.Add(health, reallocated.fSource, ESeverity::kWarning,
              DiskOf(health) + " has replaced bad sectors: " + std::to_string(*reallocated.fValue),
              "Watch the number, and replace the disk if it grows.");
  }
}

std::string MembersText(std::uint64_t count, std::uint64_t all) {
  return std::to_string(count) + " of " + std::to_string(all) + (count == 1 ? " members is" : " members are");
}

// Whether the array is one that runs when it is complete. A container is always inactive. The kernel does not know the level of
// an array before it runs, but it knows the version of metadata of its own form, such as 1.2.
bool ShouldRun(TElement const& array) {
  auto const level = array.Text("Level"), metadata = array.Text("MetadataVersion");
  if (level.IsKnown()) return *level.fValue != "container";
  return metadata.IsKnown() && metadata.fValue->find_first_of("0123456789") == 0;
}

// Returns whether the array runs, as far as it is known.
bool AskWhetherItRuns(TRuleRun& run, TElement const& array, std::string const& name) {
  auto const state = array.Text("State");
  if (!run.Know(array, state)) return true;
  bool const isStopped = *state.fValue == "inactive" || *state.fValue == "clear", isBroken = *state.fValue == "broken";
  if (isBroken)
    run.Add(
        array, state.fSource, ESeverity::kCritical, name + " is broken: it has lost more members than it can do without",
        "Connect the missing disks, then stop the array and assemble it again (mdadm --stop, mdadm --assemble); if a disk has "
        "failed, restore the data.");
  else if (isStopped && ShouldRun(array))
    run.Add(array, state.fSource, ESeverity::kCritical, name + " does not run (" + *state.fValue + ")",
            "Connect the missing disks (mdadm --examine shows the members), then start the array (mdadm --run).");
  return !isBroken && !isStopped;
}

void AskWhetherItIsComplete(TRuleRun& run, TElement const& array, std::string const& name) {
  auto const missing = array.Number("MissingMembers"), members = array.Number("Members"),
             redundancy = array.Number("PackageRedundancy");
  if (!run.Know(array, missing) || *missing.fValue == 0) return;
  std::string const lacks = MembersText(*missing.fValue, members.IsKnown() ? *members.fValue : *missing.fValue) + " missing";
  auto const action = array.Text("Action");
  bool const isRebuilding = action.IsKnown() && (*action.fValue == "recover" || *action.fValue == "resync");
  if (isRebuilding)
    run.Add(array, missing.fSource, ESeverity::kWarning, name + " is being rebuilt: " + lacks,
            "Wait until it is complete; until then a further failure may lose the data.");
  else
    run.Add(array, missing.fSource, redundancy.IsKnown() && *redundancy.fValue == 0 ? ESeverity::kCritical : ESeverity::kError,
            name + " is degraded: " + lacks, "Replace the failed disk and add the new one (mdadm --add).");
}

void AskDegradedArray(TRuleRun& run) {
  for (TElement const& array : run.Elements("ZEP_RaidArray")) {
    std::string const name = "the RAID array " + array.NameIn("DeviceID");
    if (AskWhetherItRuns(run, array, name)) AskWhetherItIsComplete(run, array, name);
  }
}

}  // namespace

std::vector<TRule> StorageRules() {
  return {{"disk-failing", "Does a disk report that it is failing, or too hot?", AskFailingDisk},
          {"disk-lost", "Has the kernel lost a disk?", AskLostDisk},
          {"disk-worn", "Is a solid-state disk worn?", AskWornDisk},
          {"disk-sectors", "Does a disk have bad sectors or uncorrected errors?", AskBadSectors},
          {"array-degraded", "Does a RAID array not run, or lack a member?", AskDegradedArray}};
}

}  // namespace NQRVZEP20
