// SPDX-License-Identifier: Apache-2.0
#include "providers/controller/EventWords.h"

#include "tests/providers/controller/ControllerBytes.h"

#include <gtest/gtest.h>

namespace NQRVZEP20 {
namespace {

constexpr int kThreshold = 1, kSpecific = 0x6F, kDeasserted = 0x80;
constexpr int kTemperature = 1, kPowerSupply = 8, kMemory = 0x0C, kSlot = 0x21;

TEST(EventWordsTest, EventsAreWritten) {
  struct TRow {
    std::string fEvent, fText;
    EEventSeverity fSeverity;
  };
  TRow const rows[] = {
      {SelEvent(1, kTemperature, 0x30, kThreshold, 0x59, 91, 90),
       "Upper Critical - going high, asserted; reading 91, threshold 90 degrees C", EEventSeverity::kCritical},
      {SelEvent(1, kTemperature, 0x30, kThreshold | kDeasserted, 0x09), "Upper Critical - going high, deasserted",
       EEventSeverity::kInformation},
      {SelEvent(1, kTemperature, 0x30, kThreshold, 0x07), "Upper Non-critical - going high, asserted", EEventSeverity::kWarning},
      {SelEvent(1, kPowerSupply, 0x51, kSpecific, 0x01), "Power Supply Failure detected, asserted", EEventSeverity::kCritical},
      {SelEvent(1, kMemory, 0x60, kSpecific, 0x00), "Correctable ECC/other correctable memory error, asserted",
       EEventSeverity::kWarning},
      {SelEvent(1, kMemory, 0x60, kSpecific, 0x38, 0xFF, 4), "Spare, asserted; Memory module/device #4",
       EEventSeverity::kInformation},
      {SelEvent(1, kMemory, 0x60, kSpecific, 0x08, 0xFF, 4), "Spare, asserted", EEventSeverity::kInformation},
      {SelEvent(1, kSlot, 0x61, kSpecific, 0xF0, 0, 7),
       "Fault Status asserted, asserted; Slot/Connector Type = PCI; Slot/Connector #7", EEventSeverity::kCritical},
      {SelEvent(1, kMemory, 0x60, kSpecific, 0x0F), "state 15, asserted", EEventSeverity::kUnknown},
  };
  auto const sensor = SdrRecordFrom(FullSensorRecord(1, 0x30, "CPU Temp")).fSensor;
  for (TRow const& row : rows) {
    auto const entry = SelEntryFrom(row.fEvent);
    ASSERT_TRUE(entry);
    EXPECT_EQ(EventText(*entry, &*sensor), row.fText);
    EXPECT_EQ(SeverityOf(*entry), row.fSeverity) << row.fText;
  }
}

TEST(EventWordsTest, AnEntryInAFormOfTheMakerIsShownInHexadecimal) {
  std::string bytes = SelEvent(1, 2, 3, 4, 5);
  bytes[2] = '\xC0';
  auto const entry = SelEntryFrom(bytes);
  EXPECT_EQ(EventText(*entry, nullptr), "entry in a form of the maker: 01 00 c0 80 44 17 60 20 00 04 02 03 04 05 ff ff");
  EXPECT_EQ(SeverityOf(*entry), EEventSeverity::kUnknown);
}

TEST(EventWordsTest, NumbersHaveNames) {
  EXPECT_EQ(SensorTypeName(kPowerSupply), "Power Supply");
  EXPECT_EQ(SensorTypeName(0xD0), "sensor type 0xd0");
  EXPECT_EQ(UnitText({false, 18}), "RPM");
  EXPECT_EQ(UnitText({false, 85, TSensorUnit::kNone, 0, 3}), "packets per s");
  EXPECT_EQ(UnitText({false, 17, TSensorUnit::kMultiplied, 34}), "CFM * m");
  EXPECT_EQ(UnitText({true}), "%");
  EXPECT_EQ(UnitText({}), "");
  EXPECT_EQ(UnitText({false, 0xFF}), "");
  EXPECT_EQ(StateName(kPowerSupply, kSpecific, 0), "Presence detected");
  EXPECT_EQ(StateName(kPowerSupply, 0x0B, 1), "Redundancy Lost");
}

TEST(SelEntryTest, ATimeIsADateOrCountsFromTheStartOfTheController) {
  EXPECT_EQ(SelTimeFrom(0xFFFFFFFF).fKind, TSelTime::EKind::kUnknown);
  EXPECT_EQ(SelTimeFrom(0x1FFFFFFF).fKind, TSelTime::EKind::kSinceStart);
  EXPECT_EQ(SelTimeFrom(1612137600).fKind, TSelTime::EKind::kDate);
  EXPECT_FALSE(SelEntryFrom(std::string(15, '\0')));
}

}  // namespace
}  // namespace NQRVZEP20
