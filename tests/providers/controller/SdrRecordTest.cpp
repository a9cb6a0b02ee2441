// SPDX-License-Identifier: Apache-2.0
#include "providers/controller/SdrRecord.h"

#include "providers/controller/EventWords.h"
#include "tests/providers/controller/ControllerBytes.h"

#include <gtest/gtest.h>

namespace NQRVZEP20 {
namespace {

TEST(SdrRecordTest, AFullSensorHasScaleAndThresholds) {
  auto const sensor = SdrRecordFrom(FullSensorRecord(1, 0x30, "CPU Temp")).fSensor;
  ASSERT_TRUE(sensor);
  EXPECT_EQ(sensor->fKind, TSdrSensor::EKind::kFull);
  EXPECT_EQ(sensor->fNumber, 0x30);
  EXPECT_EQ(sensor->fType, 1);
  EXPECT_EQ(sensor->fReadingType, 1);
  EXPECT_EQ(*sensor->fName, "CPU Temp");
  EXPECT_EQ(UnitText(sensor->fUnit), "degrees C");
  EXPECT_EQ(*ValueOf(sensor->fScale, 45), 45);
  EXPECT_EQ(sensor->fThresholds.fValid, 0x38);
  EXPECT_EQ(sensor->fThresholds.fRaw[TRawThresholds::kUpperNonCritical], 80);
  EXPECT_EQ(sensor->fThresholds.fRaw[TRawThresholds::kUpperCritical], 90);
  EXPECT_EQ(sensor->fThresholds.fRaw[TRawThresholds::kUpperFatal], 100);
}

TEST(SdrRecordTest, NumbersBelowZeroAreRead) {
  std::string record = FullSensorRecord(1, 1, "V");
  record[20] = '\x80';  // signed readings
  record[24] = '\x38';  // M: -200
  record[25] = '\xC0';
  record[26] = '\xFB';  // B: -5
  record[27] = '\xC0';
  record[29] = '\xD1';  // exponents -3 and 1
  TSensorScale const scale = SdrRecordFrom(record).fSensor->fScale;
  EXPECT_EQ(scale.fM, -200);
  EXPECT_EQ(scale.fB, -5);
  EXPECT_DOUBLE_EQ(*ValueOf(scale, 0xFF), (-200 * -1 - 5 * 10) / 1000.0);
  EXPECT_FALSE(scale.IsWhole());
}

TEST(SdrRecordTest, ACompactSensorHasNoNumber) {
  auto const sensor = SdrRecordFrom(CompactSensorRecord(2, 0x51, 8, "PSU 1")).fSensor;
  ASSERT_TRUE(sensor);
  EXPECT_EQ(sensor->fType, 8);
  EXPECT_EQ(sensor->fReadingType, 0x6F);
  EXPECT_EQ(*sensor->fName, "PSU 1");
  EXPECT_EQ(ValueOf(sensor->fScale, 1).Why().fCode, kMissingNotApplicable);
}

TEST(SdrRecordTest, AFullRecordOfASensorWithStatesHasNoNumber) {
  std::string record = FullSensorRecord(1, 0x51, "PSU 1");
  record[13] = '\x6F';  // reading type
  record[21] = 0;       // unit
  EXPECT_FALSE(SdrRecordFrom(record).fSensor->fScale.HasNumber());
  record[21] = 6;
  EXPECT_TRUE(SdrRecordFrom(record).fSensor->fScale.HasNumber()) << "a unit";
  record[21] = 0;
  record[20] = 1;
  EXPECT_TRUE(SdrRecordFrom(record).fSensor->fScale.HasNumber()) << "a percentage";
}

TEST(SdrRecordTest, AnEventOnlySensorHasAName) {
  auto const sensor = SdrRecordFrom(EventOnlyRecord(2, 0x77, 0x12, "Power On")).fSensor;
  ASSERT_TRUE(sensor);
  EXPECT_EQ(sensor->fKind, TSdrSensor::EKind::kEventOnly);
  EXPECT_EQ(sensor->fNumber, 0x77);
  EXPECT_EQ(sensor->fType, 0x12);
  EXPECT_EQ(*sensor->fName, "Power On");
}

TEST(SdrRecordTest, SensorsThatShareARecordHaveNumbersAndNamesOfTheirOwn) {
  auto const sharersOf = [](int number, int sharing, int offset) {
    std::string record = CompactSensorRecord(1, number, 8, "PSU ");
    record[23] = static_cast<char>(sharing);
    record[24] = static_cast<char>(offset);
    std::string text;
    for (TSdrSensor const& sensor : SharersOf(*SdrRecordFrom(record).fSensor))
      text += std::to_string(sensor.fNumber) + " " + *sensor.fName + ", ";
    return text;
  };
  EXPECT_EQ(sharersOf(7, 0, 5), "7 PSU, ") << "one sensor";
  EXPECT_EQ(sharersOf(7, 1, 5), "7 PSU, ") << "one sensor";
  EXPECT_EQ(sharersOf(7, 3, 1), "7 PSU 1, 8 PSU 2, 9 PSU 3, ");
  EXPECT_EQ(sharersOf(7, 0x13, 24), "7 PSU Y, 8 PSU Z, 9 PSU AA, ");
  EXPECT_EQ(sharersOf(0xFE, 2, 0), "254 PSU 0, ") << "there is no sensor 255";
  std::string events = EventOnlyRecord(1, 7, 0x12, "Slot ");
  events[12] = 2;
  EXPECT_EQ(SharersOf(*SdrRecordFrom(events).fSensor).size(), 2U);
}

TEST(SdrRecordTest, AFruDeviceIsLocated) {
  auto const fru = SdrRecordFrom(FruLocatorRecord(3, 5, "Riser")).fFru;
  ASSERT_TRUE(fru);
  EXPECT_TRUE(fru->fIsLogical);
  EXPECT_EQ(fru->fDevice, 5);
  EXPECT_EQ(*fru->fName, "Riser");
}

TEST(SdrRecordTest, ARecordThatIsCutShortDescribesNothing) {
  std::string const record = FullSensorRecord(1, 0x30, "CPU Temp");
  for (std::size_t length = 0; length < 48; ++length) {
    TSdrRecord const cut = SdrRecordFrom(record.substr(0, length));
    EXPECT_FALSE(cut.fSensor || cut.fFru) << length;
  }
  EXPECT_EQ(*SdrRecordFrom(record.substr(0, 50)).fSensor->fName, "CP");
}

TEST(SdrRecordTest, BytesBeyondTheStatedLengthAreIgnored) {
  std::string record = FullSensorRecord(1, 0x30, "CPU Temp");
  record[4] = static_cast<char>(record[4] - 5);
  EXPECT_EQ(*SdrRecordFrom(record).fSensor->fName, "CPU");
}

}  // namespace
}  // namespace NQRVZEP20
