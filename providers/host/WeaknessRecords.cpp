// SPDX-License-Identifier: Apache-2.0
#include "WeaknessRecords.h"

namespace NQRVZEP20 {

namespace {

std::string const kDirectory = "/sys/devices/system/cpu/vulnerabilities/";

enum EState : std::uint16_t { kUnknown = 0, kNotAffected = 2, kMitigated = 3, kVulnerable = 4 };

constexpr TValueName kStateNames[] = {{"0", "Unknown"}, {"2", "Not Affected"}, {"3", "Mitigated"}, {"4", "Vulnerable"}};
constexpr struct {
  char const* fStart;
  EState fState;
} kStarts[] = {{"Not affected", kNotAffected},        {"Mitigation", kMitigated},      {"Vulnerable", kVulnerable},
               {"Processor vulnerable", kVulnerable}, {"KVM: Mitigation", kMitigated}, {"KVM: Vulnerable", kVulnerable}};

bool StartsWith(std::string const& text, std::string const& start) { return text.compare(0, start.size(), start) == 0; }

std::uint16_t StateFrom(std::string const& status) {
  for (auto const& [start, state] : kStarts)
    if (StartsWith(status, start)) return state;
  return kUnknown;
}

// The text after "Mitigation: ", which names the means.
TFinding<std::string> MitigationFrom(std::string const& status) {
  if (StateFrom(status) == kNotAffected) return TMissing{kMissingNotApplicable, "this machine is not affected"};
  std::string const word = "Mitigation: ";
  std::size_t const at = status.find(word);
  if (at == std::string::npos) return TMissing{kMissingNotGiven, "the kernel reports no mitigation: \"" + status + "\""};
  return status.substr(at + word.size());
}

}  // namespace

TRecord WeaknessRecord(std::string const& name, TFinding<std::string> const& status) {
  TRecord record("ZEP_ProcessorWeakness", kDirectory, "CIM_ManagedElement");
  record.AddKey("Name", name);
  record.Add("State", status.Then(StateFrom)).Names(kStateNames);
  record.Add("Mitigation", status.Then(MitigationFrom));
  record.Add("KernelStatus", status);
  return record;
}

std::vector<TRecord> WeaknessRecords(TMachineFiles const& files) {
  std::vector<TRecord> records;
  for (std::string const& name : files.Names(kDirectory)) records.push_back(WeaknessRecord(name, files.Line(kDirectory + name)));
  return records;
}

}  // namespace NQRVZEP20
