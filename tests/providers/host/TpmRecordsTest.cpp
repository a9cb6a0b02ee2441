// SPDX-License-Identifier: Apache-2.0
#include "providers/host/TpmRecords.h"

#include "tests/Support.h"
#include "tests/providers/host/KernelTree.h"
#include "tests/providers/host/Structures.h"

#include <gtest/gtest.h>

namespace NQRVZEP20 {
namespace {

TSystemName const kName{"db1", "uname"};
TSourcedStructure const kAbsent{TSmbiosStructure(TMissing{kMissingNotGiven, "the tables have none"}), "SMBIOS type 43"};

class TpmRecordsTest : public testing::Test {
protected:
  std::vector<TRecord> Records(std::vector<TSmbiosStructure> const& structures = {}) {
    return TpmRecords(TMachineFiles(fRoot.Path()), structures, kAbsent, kName);
  }

  TTempDir fRoot;
  TKernelTree fTree{fRoot.Path()};
};

TStructureMaker MakerOf(unsigned major, unsigned minor, unsigned firmware) {
  TStructureMaker maker(43, 0x1f);
  maker.Bytes(0x04, "IFX").Byte(0x08, major).Byte(0x09, minor).DWord(0x0a, firmware).Text(0x12, "Example TPM").Byte(0x13, 0x08);
  return maker;
}

TEST_F(TpmRecordsTest, TheKernelHasTheVersionAndTheBanks) {
  fTree.Write("/sys/class/tpm/tpm0/tpm_version_major", "2");
  fTree.Write("/sys/class/tpm/tpm0/pcr-sha1/0", "");
  fTree.Write("/sys/class/tpm/tpm0/pcr-sha256/0", "");
  fTree.Write("/sys/class/tpm/tpm1/caps", "Manufacturer: 0x49465800\nTCG version: 1.2\nFirmware version: 3.17");
  fTree.Write("/sys/class/tpm/tpm2/caps", "none");
  auto const records = Records();
  ASSERT_EQ(records.size(), 3u);
  EXPECT_EQ(PropertyOf(records[0], "DeviceID"), "string tpm0");
  EXPECT_EQ(PropertyOf(records[0], "SpecificationVersion"), "string 2.0");
  EXPECT_EQ(PropertyOf(records[0], "RegisterBanks"), "string { sha1, sha256 }");
  EXPECT_EQ(PropertyOf(records[0], "Vendor"), "string NULL not-given: the tables have none");
  EXPECT_EQ(PropertyOf(records[1], "SpecificationVersion"), "string 1.2");
  EXPECT_EQ(PropertyOf(records[2], "SpecificationVersion"), "string NULL not-given: the tables have none");
}

TEST_F(TpmRecordsTest, TheFirmwareHasTheMakerAndTheVersions) {
  fTree.Write("/sys/class/tpm/tpm0/tpm_version_major", "2");
  auto const records = Records({MakerOf(2, 0, 7 << 16 | 62).Make(), MakerOf(1, 2, 0x11030000).Make()});
  ASSERT_EQ(records.size(), 2u);
  EXPECT_EQ(PropertyOf(records[0], "DeviceID"), "string tpm0");
  EXPECT_EQ(PropertyOf(records[0], "Vendor"), "string IFX");
  EXPECT_EQ(PropertyOf(records[0], "Description"), "string Example TPM");
  EXPECT_EQ(PropertyOf(records[0], "FirmwareVersion"), "string 7.62");
  EXPECT_EQ(PropertyOf(records[0], "Characteristics"), "string { Family configurable via firmware update }");
  EXPECT_EQ(PropertyOf(records[1], "DeviceID"), "string TPM 1");
  EXPECT_EQ(PropertyOf(records[1], "SpecificationVersion"), "string 1.2");
  EXPECT_EQ(PropertyOf(records[1], "FirmwareVersion"), "string 3.17");
  EXPECT_EQ(PropertyOf(records[1], "RegisterBanks"),
            "string NULL not-given: the kernel does not list the module in /sys/class/tpm/");
}

TEST_F(TpmRecordsTest, AModuleOfAnotherMachineHasOnlyTheFactsOfTheFirmware) {
  fTree.Write("/sys/class/tpm/tpm0/tpm_version_major", "2");
  auto const records = TpmRecords(TMissing{"code", "why"}, {MakerOf(2, 0, 0).Make()}, kAbsent, kName);
  ASSERT_EQ(records.size(), 1u);
  EXPECT_EQ(PropertyOf(records[0], "DeviceID"), "string TPM 0");
  EXPECT_EQ(PropertyOf(records[0], "SpecificationVersion"), "string 2.0");
  EXPECT_EQ(PropertyOf(records[0], "RegisterBanks"), "string NULL code: why");
}

}  // namespace
}  // namespace NQRVZEP20
