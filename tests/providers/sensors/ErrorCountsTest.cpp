// SPDX-License-Identifier: Apache-2.0
#include "providers/sensors/ErrorCounts.h"

#include "tests/Support.h"

#include <gmock/gmock.h>

#include <filesystem>

namespace NQRVZEP20 {
namespace {

using testing::ElementsAre;
using testing::IsEmpty;

class ErrorCountsTest : public testing::Test {
protected:
  void Write(std::string const& path, std::string const& text) const {
    std::filesystem::create_directories(std::filesystem::path(fDir.Path(path)).parent_path());
    WriteFile(fDir.Path(path), text);
  }

  TTempDir const fDir;
  TMachineFiles const fFiles{fDir.Path()};
};

TEST_F(ErrorCountsTest, ModulesFollowTheirController) {
  std::string const controller = "sys/devices/system/edac/mc/mc0/";
  Write(controller + "ce_noinfo_count", "2\n");
  Write(controller + "ue_noinfo_count", "0\n");
  Write(controller + "dimm3/dimm_label", "CPU0_DIMM_A1\n");
  Write(controller + "dimm3/dimm_location", "channel 0 slot 1 \n");
  Write(controller + "dimm3/dimm_ce_count", "17\n");
  Write(controller + "dimm3/dimm_ue_count", "1\n");
  Write(controller + "power/control", "auto\n");
  auto const errors = ReadMemoryErrors(fFiles);
  ASSERT_EQ(errors.size(), 2u);
  EXPECT_EQ(errors[0].fName, "mc0");
  EXPECT_EQ(*errors[0].fCorrected, 2u);
  EXPECT_EQ(errors[0].fLabel.Why().fCode, kMissingNotApplicable);
  EXPECT_EQ(errors[1].fName, "mc0 dimm3");
  EXPECT_EQ(*errors[1].fLabel, "CPU0_DIMM_A1");
  EXPECT_EQ(*errors[1].fLocation, "channel 0 slot 1");
  EXPECT_EQ(*errors[1].fCorrected, 17u);
  EXPECT_EQ(*errors[1].fUncorrected, 1u);
}

TEST_F(ErrorCountsTest, APciFunctionHasItsTotalsAndTheKindsThatOccurred) {
  std::string const function = "sys/bus/pci/devices/0000:01:00.0/aer_dev_";
  Write(function + "correctable", "RxErr 0\nBadTLP 3\nBadDLLP 0\nTOTAL_ERR_COR 3\n");
  Write(function + "nonfatal", "Undefined 0\nTLP 1\nTOTAL_ERR_NONFATAL 1\n");
  Write(function + "fatal", "Undefined 0\nTOTAL_ERR_FATAL 0\n");
  Write("sys/bus/pci/devices/0000:00:1f.0/class", "0x060100\n");
  auto const errors = ReadPciErrors(fFiles);
  ASSERT_EQ(errors.size(), 1u);
  EXPECT_EQ(errors[0].fAddress, "0000:01:00.0");
  EXPECT_EQ(*errors[0].fCorrectable, 3u);
  EXPECT_EQ(*errors[0].fNonFatal, 1u);
  EXPECT_EQ(*errors[0].fFatal, 0u);
  EXPECT_THAT(*errors[0].fKinds, ElementsAre("BadTLP 3", "TLP 1"));
}

TEST_F(ErrorCountsTest, OtherTextsAreNotCounters) {
  for (char const* text : {"", "RxErr 0\n", "RxErr\nTOTAL_ERR_COR 0\n", "TOTAL_ERR_COR many\n", "TOTAL_ERR_COR -1\n"})
    EXPECT_EQ(AerCountersFrom(text).Why().fCode, kMissingUnexpected) << text;
}

TEST_F(ErrorCountsTest, AMachineWithoutCountersHasNone) {
  EXPECT_THAT(ReadMemoryErrors(fFiles), IsEmpty());
  EXPECT_THAT(ReadPciErrors(fFiles), IsEmpty());
}

}  // namespace
}  // namespace NQRVZEP20
