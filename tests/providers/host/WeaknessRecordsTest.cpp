// SPDX-License-Identifier: Apache-2.0
#include "providers/host/WeaknessRecords.h"

#include "tests/Support.h"
#include "tests/providers/host/KernelTree.h"
#include "tests/providers/host/Structures.h"

#include <gtest/gtest.h>

namespace NQRVZEP20 {
namespace {

TEST(WeaknessRecordsTest, TheStateIsThatOfTheText) {
  struct TRow {
    char const *fStatus, *fState, *fMitigation;
  } const rows[] = {
      {"Not affected", "2", "NULL not-applicable: this machine is not affected"},
      {"Mitigation: Retpolines; STIBP: disabled", "3", "Retpolines; STIBP: disabled"},
      {"Vulnerable", "4", "NULL not-given: the kernel reports no mitigation: \"Vulnerable\""},
      {"Vulnerable: Clear CPU buffers attempted, no microcode", "4",
       "NULL not-given: the kernel reports no mitigation: \"Vulnerable: Clear CPU buffers attempted, no microcode\""},
      {"KVM: Mitigation: VMX disabled", "3", "VMX disabled"},
      {"Unknown: No mitigations", "0", "NULL not-given: the kernel reports no mitigation: \"Unknown: No mitigations\""},
  };
  for (TRow const& row : rows) {
    TRecord const record = WeaknessRecord("spectre_v2", std::string(row.fStatus));
    EXPECT_EQ(PropertyOf(record, "State"), "uint16 " + std::string(row.fState)) << row.fStatus;
    EXPECT_EQ(PropertyOf(record, "Mitigation"), "string " + std::string(row.fMitigation));
    EXPECT_EQ(PropertyOf(record, "KernelStatus"), "string " + std::string(row.fStatus));
  }
}

TEST(WeaknessRecordsTest, EachFileIsAWeakness) {
  TTempDir const root;
  TMachineFiles const files(root.Path());
  EXPECT_TRUE(WeaknessRecords(files).empty());
  TKernelTree const tree(root.Path());
  tree.Write("/sys/devices/system/cpu/vulnerabilities/mds", "Not affected");
  tree.Write("/sys/devices/system/cpu/vulnerabilities/l1tf", "Mitigation: PTE Inversion");
  auto const records = WeaknessRecords(files);
  ASSERT_EQ(records.size(), 2u);
  EXPECT_EQ(PropertyOf(records[0], "Name"), "string l1tf");
  EXPECT_EQ(PropertyOf(records[1], "State"), "uint16 2");
}

}  // namespace
}  // namespace NQRVZEP20
