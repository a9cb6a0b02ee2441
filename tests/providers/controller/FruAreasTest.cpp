// SPDX-License-Identifier: Apache-2.0
#include "providers/controller/FruAreas.h"

#include "tests/providers/controller/ControllerBytes.h"

#include <gmock/gmock.h>

namespace NQRVZEP20 {
namespace {

using testing::ElementsAre;
using EKind = TFruArea::EKind;

TEST(FruAreasTest, EachAreaHasItsFields) {
  auto const areas = FruAreasFrom(FruDevice());
  ASSERT_TRUE(areas);
  ASSERT_EQ(areas->size(), 3U);
  TFruArea const &chassis = (*areas)[0], &board = (*areas)[1], &product = (*areas)[2];
  EXPECT_EQ(chassis.fKind, EKind::kChassis);
  EXPECT_EQ(*chassis.fPartNumber, "PN-1");
  EXPECT_EQ(*chassis.fSerialNumber, "CH123");
  EXPECT_THAT(chassis.fCustom, ElementsAre("rail kit"));
  EXPECT_EQ(chassis.fManufacturer.Why().fCode, kMissingNotApplicable);

  EXPECT_EQ(board.fKind, EKind::kBoard);
  EXPECT_EQ(*board.fManufactureTime, 1640995200U) << "1 January 2022";
  EXPECT_EQ(*board.fManufacturer, "Maker");
  EXPECT_EQ(*board.fName, "Board 7");
  EXPECT_EQ(*board.fSerialNumber, "BS 9");
  EXPECT_EQ(*board.fPartNumber, "BP-2");
  EXPECT_EQ(*board.fFileId, "file 3");

  EXPECT_EQ(product.fKind, EKind::kProduct);
  EXPECT_EQ(*product.fName, "Server Q100");
  EXPECT_EQ(*product.fPartNumber, "1234AB7");
  EXPECT_EQ(*product.fVersion, "v2");
  EXPECT_EQ(*product.fSerialNumber, "KQ12345");
  EXPECT_EQ(*product.fAssetTag, "asset 5");
  EXPECT_EQ(product.fFileId.Why().fCode, kMissingNotGiven);
}

TEST(FruAreasTest, AnAreaWithAWrongChecksumHasThatReason) {
  std::string board = BoardArea();
  board[10] ^= 1;
  auto const areas = FruAreasFrom(FruDevice(ChassisArea(), board));
  ASSERT_EQ(areas->size(), 3U);
  EXPECT_EQ((*areas)[1].fSerialNumber.Why().fReason, "the FRU area has a wrong checksum");
  EXPECT_EQ(*(*areas)[2].fSerialNumber, "KQ12345");
}

TEST(FruAreasTest, AnAreaThatIsCutShortHasThatReason) {
  std::string const device = FruDevice();
  auto const areas = FruAreasFrom(device.substr(0, device.size() - 1));
  ASSERT_EQ(areas->size(), 3U);
  EXPECT_EQ((*areas)[2].fName.Why().fReason, "the FRU area is cut short");
}

TEST(FruAreasTest, OtherBytesAreNoHeader) {
  for (std::string const& content : {std::string(), std::string("\1"), std::string(64, '\xFF'), std::string(64, '\0')})
    EXPECT_EQ(FruAreasFrom(content).Why().fReason, "the FRU device does not begin with a valid header");
}

TEST(FruAreasTest, FieldsBeyondTheAreaAreReadToItsEnd) {
  std::string area = FruArea(Bytes({25}), TextField("Maker"));
  area[3] = '\xFF';  // a field of 63 bytes in an area of 16
  area.back() = 0;
  area = WithChecksum(area.substr(0, area.size() - 1));
  auto const areas = FruAreasFrom(FruDevice(ChassisArea(), BoardArea(), area));
  EXPECT_EQ((*areas)[2].fName.Why().fReason, "the area ends before this field");
}

}  // namespace
}  // namespace NQRVZEP20
