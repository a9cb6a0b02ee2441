// SPDX-License-Identifier: Apache-2.0
#include "providers/controller/SensorInWords.h"

#include "providers/reasons/SensorValueNames.h"
#include "tests/providers/controller/ControllerBytes.h"

#include <gtest/gtest.h>

namespace NQRVZEP20 {
namespace {

TSdrSensor SensorWith(TSensorUnit const& unit) {
  TSdrSensor sensor = *SdrRecordFrom(FullSensorRecord(1, 0x30, "S1")).fSensor;
  sensor.fUnit = unit;
  return sensor;
}

// "Seconds * 10^-3"; without the power if it is 1.
std::string SchemaUnitOf(TSensorUnit const& unit) {
  TSensorNumbers const numbers = NumbersOf(SensorWith(unit));
  std::string const name = kBaseUnitsNames[numbers.fBaseUnits].fName;
  return numbers.fUnitModifier == 0 ? name : name + " * 10^" + std::to_string(numbers.fUnitModifier);
}

TEST(SensorInWordsTest, UnitsOfTheSchemaAreUsed) {
  struct {
    std::uint8_t fUnit;
    char const* fExpected;
  } const rows[] = {{0, "Unknown"},
                    {1, "Degrees C"},
                    {19, "Hertz"},
                    {20, "Seconds * 10^-6"},
                    {21, "Seconds * 10^-3"},
                    {22, "Seconds"},
                    {31, "Cubic Feet"},
                    {32, "Meters * 10^-3"},
                    {33, "Meters * 10^-2"},
                    {34, "Meters"},
                    {41, "Revolutions"},
                    {50, "Henries"},
                    {51, "Henries * 10^-3"},
                    {52, "Farads"},
                    {53, "Farads * 10^-6"},
                    {54, "Ohms"},
                    {58, "PPM (parts/million)"},
                    {59, "Other"},
                    {60, "Decibels"},
                    {66, "Bits"},
                    {67, "Other"},
                    {70, "Bytes"},
                    {71, "Other"},
                    {74, "Words (data)"},
                    {76, "QuadWords"},
                    {77, "Other"},
                    {92, "Other"},
                    {255, "Other"}};
  for (auto const& row : rows) EXPECT_EQ(SchemaUnitOf({false, row.fUnit}), row.fExpected) << int{row.fUnit};
  EXPECT_EQ(SchemaUnitOf({true, 1}), "Percentage");
  EXPECT_EQ(SchemaUnitOf({false, 17, TSensorUnit::kMultiplied, 34}), "Other");
}

TEST(SensorInWordsTest, RatesAreThoseOfTheSchema) {
  auto const rateOf = [](std::uint8_t rate) {
    return NumbersOf(SensorWith({false, 70, TSensorUnit::kNone, 0, rate})).fRateUnits;
  };
  EXPECT_EQ(*rateOf(0), 0);
  EXPECT_EQ(*rateOf(3), 3);
  EXPECT_EQ(*rateOf(6), 6);
  EXPECT_EQ(rateOf(7).Why().fReason, "the sensor's record has the undefined rate 7");
}

TEST(SensorInWordsTest, AUnitThatTheSchemaLacksIsNamed) {
  EXPECT_EQ(*UnitDescriptionOf(SensorWith({false, 85, TSensorUnit::kNone, 0, 3})), "unit: packets per s");
  EXPECT_EQ(*UnitDescriptionOf(SensorWith({false, 17, TSensorUnit::kMultiplied, 34})), "unit: CFM * m");
  EXPECT_EQ(UnitDescriptionOf(SensorWith({false, 1})).Why().fCode, kMissingNotApplicable);
  EXPECT_EQ(UnitDescriptionOf(SensorWith({false, 0xFF})).Why().fCode, kMissingUnexpected);
}

TEST(SensorInWordsTest, TheRecordHasTheUnit) {
  std::string record = FullSensorRecord(1, 1, "S1");
  record[20] = 0x1C;  // rate 3, modifier 2
  record[21] = 71;
  record[22] = 22;
  TSensorUnit const unit = SdrRecordFrom(record).fSensor->fUnit;
  EXPECT_FALSE(unit.fIsPercentage);
  EXPECT_EQ(unit.fBase, 71);
  EXPECT_EQ(unit.fModifier, TSensorUnit::kMultiplied);
  EXPECT_EQ(unit.fSecond, 22);
  EXPECT_EQ(unit.fRate, 3);
}

}  // namespace
}  // namespace NQRVZEP20
