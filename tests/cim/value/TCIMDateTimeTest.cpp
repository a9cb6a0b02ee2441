// SPDX-License-Identifier: Apache-2.0
#include "TCIMDateTime.h"

#include "TCIMDateTimeImpl.h"
#include "tests/Support.h"

#include <ctime>
#include <limits>
#include <random>
#include <string_view>

namespace NQRVZEP20 {
namespace {

constexpr char kUTC[] = "UTC0";
constexpr char kEastHour[] = "XST-1";
constexpr char kBerlin[] = "CET-1CEST,M3.5.0,M10.5.0/3";
constexpr char kLordHowe[] = "LHST-10:30LHDT-11,M10.1.0,M4.1.0";  // daylight saving shifts by half an hour

constexpr unsigned short kMaxShort = std::numeric_limits<unsigned short>::max();
constexpr unsigned int kMaxInt = std::numeric_limits<unsigned int>::max();

// Validation, comparison and arithmetic depend on the time zone. A test that sets none runs in UTC.
class TCIMDateTimeTest : public testing::Test {
protected:
  TEnvironmentGuard fZone{"TZ", kUTC};
};

TCIMDateTime At(char const* text) { return TCIMDateTime(std::string(text)); }

// ---- NULL, copies ----

TEST_F(TCIMDateTimeTest, ANewDatetimeIsNull) {
  TCIMDateTime const dateTime;
  EXPECT_TRUE(dateTime.IsNull());
  EXPECT_FALSE(dateTime.IsInterval());
  EXPECT_FALSE(dateTime.GetPrecision());
}

TEST_F(TCIMDateTimeTest, NullHasNoTextAndNoOrderAndCannotBeAdded) {
  TCIMDateTime const null;
  for (TCIMDateTime const& other : {At("20070315143000.000000+060"), At("00000001000000.000000:000"), TCIMDateTime()}) {
    EXPECT_STATUS(void(null == other), kZEPStatusInvalidDateTime);
    EXPECT_STATUS(void(other == null), kZEPStatusInvalidDateTime);
    EXPECT_STATUS(void(null < other), kZEPStatusInvalidDateTime);
    EXPECT_STATUS(void(other < null), kZEPStatusInvalidDateTime);
    EXPECT_STATUS(null + other, kZEPStatusInvalidDateTime);
    EXPECT_STATUS(other + null, kZEPStatusInvalidDateTime);
    EXPECT_STATUS(null - other, kZEPStatusInvalidDateTime);
    EXPECT_STATUS(other - null, kZEPStatusInvalidDateTime);
  }
  EXPECT_STATUS(null.ToString(), kZEPStatusInvalidDateTime);
  EXPECT_STATUS(null.ToUIString(), kZEPStatusInvalidDateTime);
}

TEST_F(TCIMDateTimeTest, ClearMakesItNullAndSetMakesItADatetimeAgain) {
  TCIMDateTime dateTime = At("20070315143000.000000+060");
  dateTime.Clear();
  EXPECT_TRUE(dateTime.IsNull());
  EXPECT_STATUS(dateTime.ToString(), kZEPStatusInvalidDateTime);
  dateTime.Set(1, 2, 3, 4, 5);
  EXPECT_FALSE(dateTime.IsNull());
  EXPECT_EQ(dateTime.ToString(), "00000001020304.000005:000");
}

TEST_F(TCIMDateTimeTest, CopiesShareNothing) {
  TCIMDateTime original = At("20070315143000.000000+060");
  original.SetPrecision(true);
  TCIMDateTime const copy(original);
  TCIMDateTime assigned;
  assigned = original;
  EXPECT_NE(copy.GetBody(), original.GetBody());
  EXPECT_NE(assigned.GetBody(), original.GetBody());

  original.Set(1, 0, 0, 0, 0);
  original.SetPrecision(false);
  for (TCIMDateTime const& other : {copy, assigned}) {
    EXPECT_EQ(other.ToString(), "20070315143000.000000+060");
    EXPECT_TRUE(other.GetPrecision());
  }
}

TEST_F(TCIMDateTimeTest, MayBeAssignedFromItself) {
  TCIMDateTime dateTime = At("20070315143000.000000+060");
  TCIMDateTime const& self = dateTime;
  dateTime = self;
  EXPECT_EQ(dateTime.ToString(), "20070315143000.000000+060");
}

TEST_F(TCIMDateTimeTest, GetBodyReturnsTheBodyInUse) {
  TCIMDateTime dateTime;
  dateTime.GetBody()->Set(1, 2, 3, 4, 5);
  EXPECT_EQ(dateTime.ToString(), "00000001020304.000005:000");
}

TEST_F(TCIMDateTimeTest, PrecisionIsStoredAndChangesNothingElse) {
  TCIMDateTime dateTime = At("20070315143000.000000+060");
  dateTime.SetPrecision(true);
  EXPECT_TRUE(dateTime.GetPrecision());
  EXPECT_EQ(dateTime.ToString(), "20070315143000.000000+060");
  EXPECT_TRUE(dateTime == At("20070315143000.000000+060"));
  dateTime.Set(1, 2, 3, 4, 5);
  EXPECT_TRUE(dateTime.GetPrecision());
  EXPECT_FALSE((dateTime + dateTime).GetPrecision());
  dateTime.SetPrecision(false);
  EXPECT_FALSE(dateTime.GetPrecision());
}

// ---- Fields ----

TEST_F(TCIMDateTimeTest, TimestampHoldsItsFields) {
  TCIMDateTime const dateTime(2007, 3, 15, 14, 31, 59, 123456, -300);
  EXPECT_FALSE(dateTime.IsNull());
  EXPECT_FALSE(dateTime.IsInterval());
  EXPECT_EQ(dateTime.GetYear(), 2007);
  EXPECT_EQ(dateTime.GetMonth(), 3);
  EXPECT_EQ(dateTime.GetDay(), 15u);
  EXPECT_EQ(dateTime.GetHour(), 14);
  EXPECT_EQ(dateTime.GetMinute(), 31);
  EXPECT_EQ(dateTime.GetSecond(), 59);
  EXPECT_EQ(dateTime.GetMicroSeconds(), 123456u);
  EXPECT_EQ(dateTime.GetUTCOffset(), -300);
}

TEST_F(TCIMDateTimeTest, IntervalHoldsItsFields) {
  TCIMDateTime const interval(4000000000u, 23, 59, 58, 999999);
  EXPECT_FALSE(interval.IsNull());
  EXPECT_TRUE(interval.IsInterval());
  EXPECT_EQ(interval.GetDay(), 4000000000u);
  EXPECT_EQ(interval.GetHour(), 23);
  EXPECT_EQ(interval.GetMinute(), 59);
  EXPECT_EQ(interval.GetSecond(), 58);
  EXPECT_EQ(interval.GetMicroSeconds(), 999999u);
}

TEST_F(TCIMDateTimeTest, SetChangesTheKind) {
  TCIMDateTime dateTime = At("20070315143000.000000+060");
  dateTime.Set(1, 2, 3, 4, 5);
  EXPECT_TRUE(dateTime.IsInterval());
  dateTime.Set(2007, 3, 15, 14, 30, 0, 0, 60);
  EXPECT_FALSE(dateTime.IsInterval());
  dateTime.Set("00000001020304.000005:000");
  EXPECT_TRUE(dateTime.IsInterval());
  dateTime.Set("20070315143000.000000+060");
  EXPECT_FALSE(dateTime.IsInterval());
}

TEST_F(TCIMDateTimeTest, IntervalFieldsExceptTheDaysAreLimited) {
  struct TRow {
    unsigned int fDays;
    unsigned short fHours, fMinutes, fSeconds;
    unsigned int fMicroSeconds;
    bool fIsValid;
  };
  TRow const rows[] = {
      {0, 0, 0, 0, 0, true},          {0, 23, 59, 59, 999999, true},  {kMaxInt, 23, 59, 59, 999999, true},
      {0, 24, 0, 0, 0, false},        {0, 25, 0, 0, 0, false},        {0, kMaxShort, 0, 0, 0, false},
      {0, 0, 60, 0, 0, false},        {0, 0, kMaxShort, 0, 0, false}, {0, 0, 0, 60, 0, false},
      {0, 0, 0, kMaxShort, 0, false}, {0, 0, 0, 0, 1000000, false},   {0, 0, 0, 0, kMaxInt, false},
  };
  for (TRow const& row : rows) {
    SCOPED_TRACE(testing::Message() << row.fDays << ' ' << row.fHours << ' ' << row.fMinutes << ' ' << row.fSeconds << ' '
                                    << row.fMicroSeconds);
    EXPECT_EQ(TCIMDateTimeImpl::IsValid(row.fDays, row.fHours, row.fMinutes, row.fSeconds, row.fMicroSeconds), row.fIsValid);
    TCIMDateTime interval = At("20070315143000.000000+060");
    if (row.fIsValid) {
      interval.Set(row.fDays, row.fHours, row.fMinutes, row.fSeconds, row.fMicroSeconds);
      EXPECT_TRUE(interval.IsInterval());
      continue;
    }
    EXPECT_STATUS(interval.Set(row.fDays, row.fHours, row.fMinutes, row.fSeconds, row.fMicroSeconds), kZEPStatusInvalidDateTime);
    EXPECT_STATUS(TCIMDateTime(row.fDays, row.fHours, row.fMinutes, row.fSeconds, row.fMicroSeconds), kZEPStatusInvalidDateTime);
    EXPECT_EQ(interval.ToString(), "20070315143000.000000+060");
  }
}

TEST_F(TCIMDateTimeTest, TimestampIsValidUnlessMktimeReturnsMinusOne) {
  struct TRow {
    char const* fZone;
    unsigned short fYear, fMonth;
    unsigned int fDay;
    unsigned short fHour, fMinute, fSecond;
    unsigned int fMicroSeconds;
    short fUtcOffset;
    bool fIsValid;
  };
  TRow const rows[] = {
      {kUTC, 2007, 3, 15, 14, 30, 0, 0, 60, true},
      {kUTC, 2007, 13, 15, 14, 30, 75, 0, 0, true},  // mktime normalises
      {kUTC, 2007, 0, 0, 99, 99, 99, 0, 999, true},
      {kUTC, kMaxShort, kMaxShort, kMaxInt, kMaxShort, kMaxShort, kMaxShort, 0, 32767, true},
      {kUTC, kMaxShort, kMaxShort, 31, kMaxShort, kMaxShort, kMaxShort, 0, -32768, true},
      {kUTC, 0, 0, 0, 0, 0, 0, 0, 0, true},
      {kUTC, 2007, 3, 15, 14, 30, 0, kMaxInt, 60, true},  // microseconds are not checked
      // The one instant that mktime reports as -1, written in several ways.
      {kUTC, 1969, 12, 31, 23, 59, 59, 0, 0, false},
      {kUTC, 1969, 12, 31, 23, 59, 58, 0, 0, true},
      {kUTC, 1969, 12, 31, 23, 59, 60, 0, 0, true},
      {kUTC, 1969, 12, 31, 22, 59, 59, 0, -60, false},
      {kUTC, 1970, 1, 2, 0, 59, 59, 0, 1500, false},
      {kUTC, 1970, 2, 0, 0, 0, 0, 0, 0, true},
      {kUTC, 1970, 1, 0, 23, 59, 59, 0, 0, false},
      {kUTC, 1972, 1, 4294966566u, 23, 59, 59, 0, 0, false},  // a day of more than 31 bits becomes negative
      {kUTC, 1972, 1, 4294966565u, 23, 59, 59, 0, 0, true},
      {kEastHour, 1970, 1, 2, 0, 59, 59, 0, 1440, false},
      {kEastHour, 1969, 12, 31, 23, 59, 59, 0, 0, true},
      {"XST5", 1969, 12, 31, 18, 59, 59, 0, 0, false},
      {"XST5", 1969, 12, 31, 23, 59, 59, 0, 0, true},
      // The epoch date is valid with any time fields.
      {kUTC, 1970, 1, 1, 0, 0, 0, 0, 0, true},
      {kUTC, 1970, 1, 1, 23, 59, 59, 999999, 0, true},
      {kUTC, 1970, 1, 1, kMaxShort, kMaxShort, kMaxShort, kMaxInt, -32768, true},
      {kUTC, 1970, 1, 1, 0, 59, 59, 0, 60, true},      // mktime would give -1
      {kEastHour, 1970, 1, 1, 0, 59, 59, 0, 0, true},  // here too
  };
  for (TRow const& row : rows) {
    SCOPED_TRACE(testing::Message() << row.fZone << ' ' << row.fYear << '-' << row.fMonth << '-' << row.fDay << ' ' << row.fHour
                                    << ':' << row.fMinute << ':' << row.fSecond << ' ' << row.fMicroSeconds << ' '
                                    << row.fUtcOffset);
    TEnvironmentGuard const zone("TZ", row.fZone);
    EXPECT_EQ(TCIMDateTimeImpl::IsValid(row.fYear, row.fMonth, row.fDay, row.fHour, row.fMinute, row.fSecond, row.fMicroSeconds,
                                        row.fUtcOffset),
              row.fIsValid);
    TCIMDateTime dateTime(1, 2, 3, 4, 5);
    auto const set = [&] {
      dateTime.Set(row.fYear, row.fMonth, row.fDay, row.fHour, row.fMinute, row.fSecond, row.fMicroSeconds, row.fUtcOffset);
    };
    if (row.fIsValid) {
      EXPECT_NO_THROW(set());
      EXPECT_FALSE(dateTime.IsInterval());
      continue;
    }
    EXPECT_STATUS(set(), kZEPStatusInvalidDateTime);
    EXPECT_EQ(dateTime.ToString(), "00000001020304.000005:000");
  }
}

// Validation avoids mktime for most times; the result must be the same as with mktime.
TEST_F(TCIMDateTimeTest, ValidationAgreesWithMktimeInEveryZone) {
  std::mt19937 random(20070315);
  auto const pick = [&](int from, int to) { return std::uniform_int_distribution<int>(from, to)(random); };
  for (char const* const zoneText : {kUTC, kEastHour, "XST5", "XST24:59:59", "XST-24:59:59", kBerlin, kLordHowe,
                                     "EST5EDT,M3.2.0,M11.1.0", "America/New_York", "Asia/Kolkata", "Pacific/Apia"}) {
    SCOPED_TRACE(zoneText);
    TEnvironmentGuard const zone("TZ", zoneText);
    for (int round = 0; round < 3000; ++round) {
      int const year = round % 2 ? pick(1968, 1973) : pick(0, kMaxShort);
      int const month = pick(0, 14), day = pick(0, 40), hour = pick(0, 30), minute = pick(0, 70), second = pick(0, 70);
      int const utcOffset = round % 3 ? pick(-999, 999) : pick(-32768, 32767);
      std::tm record{};
      record.tm_year = year - 1900, record.tm_mon = month - 1, record.tm_mday = day;
      record.tm_hour = hour, record.tm_min = minute - utcOffset, record.tm_sec = second;
      bool const isValid = (year == 1970 && month == 1 && day == 1) || std::mktime(&record) != -1;
      EXPECT_EQ(TCIMDateTimeImpl::IsValid(static_cast<unsigned short>(year), static_cast<unsigned short>(month),
                                          static_cast<unsigned int>(day), static_cast<unsigned short>(hour),
                                          static_cast<unsigned short>(minute), static_cast<unsigned short>(second), 0,
                                          static_cast<short>(utcOffset)),
                isValid)
          << year << '-' << month << '-' << day << ' ' << hour << ':' << minute << ':' << second << ' ' << utcOffset;
    }
  }
}

TEST_F(TCIMDateTimeTest, ATimeThatItsZoneSkippedIsInvalid) {
  struct {
    char const *fZone, *fText;
  } const rows[] = {
      {"Asia/Kathmandu", "19860101000500.000000+000"},  {"Europe/Moscow", "20110327023000.000000+000"},
      {"Asia/Singapore", "19811231233000.000000+000"},  {"America/Caracas", "20160501024500.000000+000"},
      {"Pacific/Fakaofo", "20111230120000.000000+000"}, {"Pacific/Fakaofo", "20111230130000.000000+060"},
  };
  for (auto const& row : rows) {
    SCOPED_TRACE(row.fZone);
    NEEDS(std::filesystem::exists(std::string("/usr/share/zoneinfo/") + row.fZone), "the zones (package tzdata)");
    TEnvironmentGuard const zone("TZ", row.fZone);
    TCIMDateTime dateTime = At("20070315143000.000000+060");
    EXPECT_STATUS(dateTime = At(row.fText), kZEPStatusInvalidDateTime);
    EXPECT_STATUS(dateTime.Set(row.fText), kZEPStatusInvalidDateTime);
    EXPECT_EQ(dateTime.ToString(), "20070315143000.000000+060");
    ::setenv("TZ", "UTC0", 1);
    EXPECT_NO_THROW(dateTime.Set(row.fText));
  }
}

// ---- Reading text ----

TEST_F(TCIMDateTimeTest, ReadsATimestamp) {
  TCIMDateTime const dateTime = At("20070315143159.123456-300");
  EXPECT_FALSE(dateTime.IsNull());
  EXPECT_FALSE(dateTime.IsInterval());
  EXPECT_EQ(dateTime.GetYear(), 2007);
  EXPECT_EQ(dateTime.GetMonth(), 3);
  EXPECT_EQ(dateTime.GetDay(), 15u);
  EXPECT_EQ(dateTime.GetHour(), 14);
  EXPECT_EQ(dateTime.GetMinute(), 31);
  EXPECT_EQ(dateTime.GetSecond(), 59);
  EXPECT_EQ(dateTime.GetMicroSeconds(), 123456u);
  EXPECT_EQ(dateTime.GetUTCOffset(), -300);
}

TEST_F(TCIMDateTimeTest, ReadsAnInterval) {
  TCIMDateTime const interval = At("12345678235958.000042:000");
  EXPECT_TRUE(interval.IsInterval());
  EXPECT_EQ(interval.GetDay(), 12345678u);
  EXPECT_EQ(interval.GetHour(), 23);
  EXPECT_EQ(interval.GetMinute(), 59);
  EXPECT_EQ(interval.GetSecond(), 58);
  EXPECT_EQ(interval.GetMicroSeconds(), 42u);
}

TEST_F(TCIMDateTimeTest, PrintsTheTextThatItRead) {
  struct TRow {
    char const* fText;
    char const* fPrinted;
  };
  TRow const rows[] = {
      {"20070315143000.000000+060", "20070315143000.000000+060"},
      {"20070315143000.000000-300", "20070315143000.000000-300"},
      {"20070315143000.000000+000", "20070315143000.000000+000"},
      {"20070315143000.000000-000", "20070315143000.000000+000"},
      {"20070315143000.000000+999", "20070315143000.000000+999"},
      {"20070315143000.000000-999", "20070315143000.000000-999"},
      {"00000000000000.000000+000", "00000000000000.000000+000"},
      {"99999999999999.999999+000", "99999999999999.999999+000"},  // mktime normalises, so these are valid
      {"19700101000000.000000+000", "19700101000000.000000+000"},
      {"19700101995959.999999+000", "19700101995959.999999+000"},
      {"19000101000000.000000+000", "19000101000000.000000+000"},
      {"00000001020304.000005:000", "00000001020304.000005:000"},
      {"00000000000000.000000:000", "00000000000000.000000:000"},
      {"99999999235959.999999:000", "99999999235959.999999:000"},
      // The character at the point's position is not checked, nor are the digits after the colon.
      {"20070315143000x000000+060", "20070315143000.000000+060"},
      {"200703151430000000000+060", "20070315143000.000000+060"},
      {"00000001020304:000005:000", "00000001020304.000005:000"},
      {"00000001020304.000005:123", "00000001020304.000005:000"},
  };
  for (TRow const& row : rows) {
    SCOPED_TRACE(row.fText);
    EXPECT_EQ(At(row.fText).ToString(), row.fPrinted);
  }
}

TEST_F(TCIMDateTimeTest, RefusesMalformedTextAndKeepsTheOldValue) {
  std::string const texts[] = {
      "",
      "2",
      "20070315143000.000000+06",    // 24
      "20070315143000.000000+0600",  // 26
      "20070315143000.000000",
      "2007-03-15T14:30:00+01:00",
      " 20070315143000.000000+060",
      "20070315143000.000000 060",
      "20070315143000.0000000060",
      "20070315143000.000000*060",
      "20070315143000.000000,060",
      "00000001020304.000005;000",
      std::string("20070315143000.000000\0"
                  "060",
                  25),
      std::string(25, '\0'),
      std::string(25, '0'),
      std::string(100000, '0'),
      "00000001240000.000000:000",  // well-formed, but not a valid interval
      "00000001250000.000000:000",
      "00000001006000.000000:000",
      "00000001000060.000000:000",
      "99999999999999.999999:000",
      "19691231235959.000000+000",  // well-formed, but the instant that mktime reports as -1
      "19691231225959.000000-060",
  };
  for (std::string const& text : texts) {
    SCOPED_TRACE(text.substr(0, 40));
    EXPECT_STATUS(TCIMDateTime{text}, kZEPStatusInvalidDateTime);
    TCIMDateTime dateTime(2007, 3, 15, 14, 30, 0, 0, 60);
    EXPECT_STATUS(dateTime.Set(text), kZEPStatusInvalidDateTime);
    EXPECT_EQ(dateTime.ToString(), "20070315143000.000000+060");
    TCIMDateTime null;
    EXPECT_STATUS(null.Set(text), kZEPStatusInvalidDateTime);
    EXPECT_TRUE(null.IsNull());
  }
}

TEST_F(TCIMDateTimeTest, RequiresADigitAtEveryPositionExceptThePointAndTheSign) {
  for (std::string const good : {"20070315143000.000000+060", "00000001020304.000005:000"})
    for (std::size_t at = 0; at < good.size(); ++at) {
      if (at == 14 || at == 21) continue;
      for (char const wrong : {'\0', ' ', '+', '-', '.', '/', ':', 'a', 'A', '\x7f', '\xb2'}) {
        std::string text = good;
        text[at] = wrong;
        SCOPED_TRACE(testing::Message() << good << " with character " << static_cast<int>(wrong) << " at " << at);
        EXPECT_STATUS(TCIMDateTime{text}, kZEPStatusInvalidDateTime);
      }
    }
}

// ---- Text ----

TEST_F(TCIMDateTimeTest, PrintsTimestampsPaddedWithZeros) {
  EXPECT_EQ(TCIMDateTime(2007, 3, 15, 14, 30, 0, 0, 60).ToString(), "20070315143000.000000+060");
  EXPECT_EQ(TCIMDateTime(2007, 3, 15, 14, 30, 0, 0, -300).ToString(), "20070315143000.000000-300");
  EXPECT_EQ(TCIMDateTime(2007, 3, 15, 14, 30, 0, 0, 0).ToString(), "20070315143000.000000+000");
  EXPECT_EQ(TCIMDateTime(7, 1, 2, 3, 4, 5, 6, -7).ToString(), "00070102030405.000006-007");
}

TEST_F(TCIMDateTimeTest, PrintsIntervalsPaddedWithZeros) {
  EXPECT_EQ(TCIMDateTime(1, 2, 3, 4, 5).ToString(), "00000001020304.000005:000");
  EXPECT_EQ(TCIMDateTime(0, 0, 0, 0, 0).ToString(), "00000000000000.000000:000");
}

TEST_F(TCIMDateTimeTest, PrintsEveryDigitOfATooWideNumber) {
  EXPECT_EQ(TCIMDateTime(4294967295u, 1, 2, 3, 4).ToString(), "4294967295010203.000004:000");
  EXPECT_EQ(TCIMDateTime(10000, 100, 101, 102, 103, 104, 1000000, 1000).ToString(), "10000100101102103104.1000000+1000");
  EXPECT_EQ(TCIMDateTime(65535, 65535, 4294967295u, 65535, 65535, 65535, 4294967295u, -32768).ToString(),
            "65535655354294967295655356553565535.4294967295-32768");
}

TEST_F(TCIMDateTimeTest, PrintsLikePrintf) {
  std::mt19937 random(20070315);
  auto const pick = [&](unsigned int to) { return std::uniform_int_distribution<unsigned int>(0, to)(random); };
  for (int round = 0; round < 20000; ++round) {
    unsigned int const wide = round % 4 == 0 ? 650 : 1;  // sometimes numbers with too many digits
    unsigned int const year = 1972 + pick(8027), month = pick(99 * wide), day = pick(99 * wide), hour = pick(99 * wide);
    unsigned int const minute = pick(99 * wide), second = pick(99 * wide), microSeconds = pick(999999 * wide);
    int const offset = static_cast<int>(pick(1998)) - 999;
    char expected[128];
    std::snprintf(expected, sizeof expected, "%04u%02u%02u%02u%02u%02u.%06u%c%03d", year, month, day, hour, minute, second,
                  microSeconds, offset < 0 ? '-' : '+', std::abs(offset));
    ASSERT_EQ(TCIMDateTime(static_cast<unsigned short>(year), static_cast<unsigned short>(month), day,
                           static_cast<unsigned short>(hour), static_cast<unsigned short>(minute),
                           static_cast<unsigned short>(second), microSeconds, static_cast<short>(offset))
                  .ToString(),
              expected);

    unsigned int const days = pick(round % 4 == 0 ? kMaxInt : 99999999);
    std::snprintf(expected, sizeof expected, "%08u%02u%02u%02u.%06u:000", days, hour % 24, minute % 60, second % 60,
                  microSeconds % 1000000);
    ASSERT_EQ(TCIMDateTime(days, static_cast<unsigned short>(hour % 24), static_cast<unsigned short>(minute % 60),
                           static_cast<unsigned short>(second % 60), microSeconds % 1000000)
                  .ToString(),
              expected);
  }
}

TEST_F(TCIMDateTimeTest, ReadableIntervalNamesEachPartThatIsNotZero) {
  struct TRow {
    unsigned int fDays;
    unsigned short fHours, fMinutes, fSeconds;
    unsigned int fMicroSeconds;
    char const* fText;
  };
  TRow const rows[] = {
      {0, 0, 0, 0, 0, ""},
      {1, 0, 0, 0, 0, "1 day "},
      {2, 0, 0, 0, 0, "2 days "},
      {0, 1, 0, 0, 0, "1 hour "},
      {0, 2, 0, 0, 0, "2 hours "},
      {0, 0, 1, 0, 0, "1 minute "},
      {0, 0, 2, 0, 0, "2 minutes "},
      {0, 0, 0, 1, 0, "1 second "},
      {0, 0, 0, 2, 0, "2 seconds "},
      {0, 0, 0, 0, 1000, "1 millisecond "},
      {0, 0, 0, 0, 2000, "2 milliseconds "},
      {0, 0, 0, 0, 1, "1 microsecond "},
      {0, 0, 0, 0, 2, "2 microseconds "},
      {0, 0, 0, 0, 999, "999 microseconds "},
      {0, 0, 0, 0, 1001, "1 millisecond 1 microsecond "},
      {0, 0, 0, 0, 999999, "999 milliseconds 999 microseconds "},
      {2, 1, 0, 0, 5000, "2 days 1 hour 5 milliseconds "},
      {1, 1, 1, 1, 1001, "1 day 1 hour 1 minute 1 second 1 millisecond 1 microsecond "},
      {4294967295u, 23, 59, 58, 2003, "4294967295 days 23 hours 59 minutes 58 seconds 2 milliseconds 3 microseconds "},
      {10, 11, 10, 21, 101000, "10 days 11 hours 10 minutes 21 seconds 101 milliseconds "},
  };
  for (TRow const& row : rows)
    EXPECT_EQ(TCIMDateTime(row.fDays, row.fHours, row.fMinutes, row.fSeconds, row.fMicroSeconds).ToUIString(), row.fText);
}

TEST_F(TCIMDateTimeTest, ReadableTimestampHasNeitherMicrosecondsNorOffset) {
  EXPECT_EQ(At("20070315143000.000000+060").ToUIString(), "03/15/2007 14:30:00");
  EXPECT_EQ(At("20070315143000.999999-300").ToUIString(), "03/15/2007 14:30:00");
  EXPECT_EQ(TCIMDateTime(7, 1, 2, 3, 4, 5, 6, 0).ToUIString(), "01/02/0007 03:04:05");
  EXPECT_EQ(TCIMDateTime(65535, 65535, 4294967295u, 65535, 65535, 65535, 0, 0).ToUIString(),
            "65535/4294967295/65535 65535:65535:65535");
}

// ---- Comparison ----

struct TOrderRow {
  char const* fZone;
  char const* fLeft;
  char const* fRight;
  int fOrder;  // -1, 0 or 1: left is less, equal, greater
};

TEST_F(TCIMDateTimeTest, ComparesTimestampsByInstantAndThenMicroseconds) {
  TOrderRow const rows[] = {
      {kUTC, "20070315143000.000000+060", "20070315143000.000000+060", 0},
      {kUTC, "20070315143000.000000+060", "20070315133000.000000+000", 0},
      {kUTC, "20070315143000.000000+060", "20070315083000.000000-300", 0},
      {kUTC, "20070315143000.000000+060", "20070315143000.000000+000", -1},
      {kUTC, "20070315143000.000000+060", "20070315133001.000000+000", -1},
      {kUTC, "20070315143000.000001+060", "20070315133000.000002+000", -1},
      {kUTC, "20070315143000.999999+060", "20070315133001.000000+000", -1},
      {kUTC, "20070101003000.000000+060", "20061231233000.000000+000", 0},
      {kUTC, "20070228250000.000000+000", "20070301010000.000000+000", 0},  // normalised
      {kUTC, "19600101000000.000000+000", "19700101000000.000000+000", -1},
      {kBerlin, "20070715143000.000000+120", "20070715123000.000000+000", 0},
      {kBerlin, "20070325013000.000000+060", "20070325023000.000000+120", 0},
      // The epoch date counts as the epoch only when mktime returns -1.
      {kEastHour, "19700101005959.000000+000", "19700101010000.000000+000", 0},
      {kEastHour, "19700101005958.000000+000", "19700101005959.000000+000", -1},
      {kEastHour, "19700101000000.000000+000", "19700101010000.000000+000", -1},
      {kUTC, "19700101005959.000000+060", "19700101000000.000000+000", 0},
      {kUTC, "19700101000000.000000+060", "19700101000000.000000+000", -1},
      {kUTC, "19700101000000.000000+000", "19700101000001.000000+000", -1},
  };
  for (TOrderRow const& row : rows) {
    SCOPED_TRACE(testing::Message() << row.fZone << ": " << row.fLeft << " and " << row.fRight);
    TEnvironmentGuard const zone("TZ", row.fZone);
    TCIMDateTime const left = At(row.fLeft), right = At(row.fRight);
    EXPECT_EQ(left == right, row.fOrder == 0);
    EXPECT_EQ(right == left, row.fOrder == 0);
    EXPECT_EQ(left < right, row.fOrder < 0);
    EXPECT_EQ(right<left, row.fOrder> 0);
  }
}

TEST_F(TCIMDateTimeTest, ComparesIntervalsByLengthAndThenMicroseconds) {
  TOrderRow const rows[] = {
      {kUTC, "00000001000000.000000:000", "00000001000000.000000:000", 0},
      {kUTC, "00000000235959.999999:000", "00000001000000.000000:000", -1},
      {kUTC, "00000001000000.000000:000", "00000001000001.000000:000", -1},
      {kUTC, "00000001000000.000001:000", "00000001000000.000002:000", -1},
      {kUTC, "00000001000000.999999:000", "00000001000001.000000:000", -1},
      {kUTC, "99999998235959.999999:000", "99999999000000.000000:000", -1},
      {kUTC, "00000000005900.000000:000", "00000000010000.000000:000", -1},
  };
  for (TOrderRow const& row : rows) {
    SCOPED_TRACE(testing::Message() << row.fLeft << " and " << row.fRight);
    TCIMDateTime const left = At(row.fLeft), right = At(row.fRight);
    EXPECT_EQ(left == right, row.fOrder == 0);
    EXPECT_EQ(left < right, row.fOrder < 0);
    EXPECT_EQ(right<left, row.fOrder> 0);
  }
  EXPECT_TRUE(TCIMDateTime(4294967294u, 23, 59, 59, 0) < TCIMDateTime(4294967295u, 0, 0, 0, 0));
}

TEST_F(TCIMDateTimeTest, ComparingATimestampWithAnIntervalThrows) {
  TCIMDateTime const timestamp = At("20070315143000.000000+060"), interval = At("00000001000000.000000:000");
  EXPECT_STATUS(void(timestamp == interval), kZEPStatusInvalidDateTime);
  EXPECT_STATUS(void(interval == timestamp), kZEPStatusInvalidDateTime);
  EXPECT_STATUS(void(timestamp < interval), kZEPStatusInvalidDateTime);
  EXPECT_STATUS(void(interval < timestamp), kZEPStatusInvalidDateTime);
}

// A timestamp that was valid in one zone may be invalid in another.
TEST_F(TCIMDateTimeTest, AnInstantThatMktimeReportsAsMinusOneCannotBeComparedOrAdded) {
  TCIMDateTime const good = At("20070315143000.000000+060"), interval = At("00000001000000.000000:000");
  TCIMDateTime bad;
  {
    TEnvironmentGuard const zone("TZ", kEastHour);
    bad.Set("19691231235959.000000+000");
  }
  EXPECT_STATUS(void(bad == good), kZEPStatusInvalidDateTime);
  EXPECT_STATUS(void(good == bad), kZEPStatusInvalidDateTime);
  EXPECT_STATUS(void(bad < good), kZEPStatusInvalidDateTime);
  EXPECT_STATUS(void(good < bad), kZEPStatusInvalidDateTime);
  EXPECT_STATUS(bad + interval, kZEPStatusInvalidDateTime);
  EXPECT_STATUS(interval + bad, kZEPStatusInvalidDateTime);
  EXPECT_STATUS(bad - interval, kZEPStatusInvalidDateTime);
  EXPECT_STATUS(interval - bad, kZEPStatusInvalidDateTime);
  EXPECT_STATUS(bad - good, kZEPStatusInvalidDateTime);
  EXPECT_STATUS(good - bad, kZEPStatusInvalidDateTime);
}

// ---- Arithmetic ----

struct TArithmeticRow {
  char const* fZone;
  char const* fLeft;
  char fOperation;
  char const* fRight;
  char const* fResult;
};

void ExpectResult(TArithmeticRow const& row) {
  SCOPED_TRACE(testing::Message() << row.fZone << ": " << row.fLeft << ' ' << row.fOperation << ' ' << row.fRight);
  TEnvironmentGuard const zone("TZ", row.fZone);
  TCIMDateTime const left = At(row.fLeft), right = At(row.fRight);
  TCIMDateTime const result = row.fOperation == '+' ? left + right : left - right;
  EXPECT_EQ(result.ToString(), row.fResult);
  EXPECT_EQ(result.IsInterval(), std::string_view(row.fResult).find(':') != std::string_view::npos);
  EXPECT_EQ(left.ToString(), row.fLeft);
  EXPECT_EQ(right.ToString(), row.fRight);
}

TEST_F(TCIMDateTimeTest, AddsIntervals) {
  TArithmeticRow const rows[] = {
      {kUTC, "00000000230000.000000:000", '+', "00000000230000.000000:000", "00000001220000.000000:000"},
      {kUTC, "00000000000000.000000:000", '+', "00000000000000.000000:000", "00000000000000.000000:000"},
      {kUTC, "00000000235959.999999:000", '+', "00000000000000.000001:000", "00000001000000.000000:000"},
      {kUTC, "00000000000000.999999:000", '+', "00000000000000.999999:000", "00000000000001.999998:000"},
      {kUTC, "00000001020304.000005:000", '+', "00000010203040.500000:000", "00000011223344.500005:000"},
      {kUTC, "50000000000000.000000:000", '+', "49999999000000.000000:000", "99999999000000.000000:000"},
      {kBerlin, "00000000230000.000000:000", '+', "00000000230000.000000:000", "00000001220000.000000:000"},
  };
  for (TArithmeticRow const& row : rows) ExpectResult(row);
}

TEST_F(TCIMDateTimeTest, DifferenceOfIntervalsHasNoSign) {
  TArithmeticRow const rows[] = {
      {kUTC, "00000001000000.000000:000", '-', "00000002000000.000000:000", "00000001000000.000000:000"},
      {kUTC, "00000002000000.000000:000", '-', "00000001000000.000000:000", "00000001000000.000000:000"},
      {kUTC, "00000001000000.000000:000", '-', "00000001000000.000000:000", "00000000000000.000000:000"},
      {kUTC, "00000001000000.000000:000", '-', "00000000000000.000001:000", "00000000235959.999999:000"},
      {kUTC, "00000000000000.000001:000", '-', "00000001000000.000000:000", "00000000235959.999999:000"},
      {kUTC, "00000000000000.000001:000", '-', "00000000000000.000003:000", "00000000000000.000002:000"},
      {kUTC, "99999999235959.999999:000", '-', "00000000000000.000000:000", "99999999235959.999999:000"},
  };
  for (TArithmeticRow const& row : rows) ExpectResult(row);
}

// A 64-bit total has room for 106751991 days.
TEST_F(TCIMDateTimeTest, TotalsOfIntervalsWrapAround) {
  EXPECT_EQ((TCIMDateTime(100000000, 0, 0, 0, 0) + TCIMDateTime(6751991, 0, 0, 0, 0)).ToString(), "106751991000000.000000:000");
  // 200000000 days are 17280000000000000000 microseconds, which is 1166744073709551616 less than 2^64.
  EXPECT_EQ((TCIMDateTime(100000000, 0, 0, 0, 0) + TCIMDateTime(100000000, 0, 0, 0, 0)).ToString(), "13503982080149.551616:000");
  EXPECT_EQ((TCIMDateTime(200000000, 0, 0, 0, 0) - TCIMDateTime(0, 0, 0, 0, 0)).ToString(), "13503982080149.551616:000");
}

TEST_F(TCIMDateTimeTest, AddsAnIntervalToATimestamp) {
  TArithmeticRow const rows[] = {
      {kUTC, "20070315143000.000000+000", '+', "00000001020304.000005:000", "20070316163304.000005+000"},
      {kUTC, "20070315143000.000000+060", '+', "00000000000000.000000:000", "20070315143000.000000+060"},
      {kUTC, "20070315143000.000000-300", '+', "00000000003000.000000:000", "20070315150000.000000-300"},
      {kUTC, "20070315143000.999999+000", '+', "00000000000000.000001:000", "20070315143001.000000+000"},
      {kUTC, "20240228120000.000000+000", '+', "00000001000000.000000:000", "20240229120000.000000+000"},
      {kUTC, "20071231235959.500000+000", '+', "00000000000000.500000:000", "20080101000000.000000+000"},
      {kUTC, "20071332256175.000000+000", '+', "00000000000000.000000:000", "20080202020215.000000+000"},
      {kUTC, "19700101000000.000000+000", '+', "00000000000001.000000:000", "19700101000001.000000+000"},
      {kEastHour, "19700101020000.000000+060", '+', "00000000000001.000000:000", "19700101020001.000000+060"},
      // The fields are in standard time, in summer too.
      {kBerlin, "20070715143000.000000+060", '+', "00000000010000.000000:000", "20070715153000.000000+060"},
      {kBerlin, "20070115143000.000000+060", '+', "00000181000000.000000:000", "20070715143000.000000+060"},
      {kBerlin, "20070715143000.000000+060", '+', "00000184000000.000000:000", "20080115143000.000000+060"},
  };
  for (TArithmeticRow const& row : rows) {
    ExpectResult(row);
    ExpectResult({row.fZone, row.fRight, '+', row.fLeft, row.fResult});
  }
}

TEST_F(TCIMDateTimeTest, TwoTimestampsCannotBeAdded) {
  TCIMDateTime const timestamp = At("20070315143000.000000+060");
  EXPECT_STATUS(timestamp + timestamp, kZEPStatusInvalidDateTime);
}

TEST_F(TCIMDateTimeTest, DifferenceOfTimestampsIsTheTimeBetweenTheirInstants) {
  TArithmeticRow const rows[] = {
      {kUTC, "20070315143000.000000+060", '-', "20070315133000.000000+000", "00000000000000.000000:000"},
      {kUTC, "20070315143000.000000+060", '-', "20070315083000.000000-300", "00000000000000.000000:000"},
      {kUTC, "20070315143000.000000+000", '-', "20070314132959.999999+000", "00000001010000.000001:000"},
      {kUTC, "20070314132959.999999+000", '-', "20070315143000.000000+000", "00000001010000.000001:000"},
      {kUTC, "20070315143000.000000+060", '-', "20070315143000.000000-060", "00000000020000.000000:000"},
      {kUTC, "20070315143000.250000+000", '-', "20070315143000.750000+000", "00000000000000.500000:000"},
      {kUTC, "19700101000000.000000+000", '-', "19600101000000.000000+000", "00003653000000.000000:000"},
      {kUTC, "20240301000000.000000+000", '-', "20240201000000.000000+000", "00000029000000.000000:000"},
      {kBerlin, "20070715143000.000000+060", '-', "20070115143000.000000+060", "00000181000000.000000:000"},
      // The epoch date counts as the epoch when mktime returns -1.
      {kEastHour, "19700101005959.000000+000", '-', "19700101010000.000000+000", "00000000000000.000000:000"},
      {kEastHour, "19700101005958.000000+000", '-', "19700101010000.000000+000", "00000000000002.000000:000"},
  };
  for (TArithmeticRow const& row : rows) ExpectResult(row);
}

TEST_F(TCIMDateTimeTest, SubtractsAnIntervalFromATimestamp) {
  TArithmeticRow const rows[] = {
      {kUTC, "20070316163304.000005+000", '-', "00000001020304.000005:000", "20070315143000.000000+000"},
      {kUTC, "20070315143000.000000-300", '-', "00000000003000.000000:000", "20070315140000.000000-300"},
      {kUTC, "20070315143000.000000+060", '-', "00000000000000.000000:000", "20070315143000.000000+060"},
      {kUTC, "20080101000000.000000+000", '-', "00000000000000.500000:000", "20071231235959.500000+000"},
      {kUTC, "20240301000000.000000+000", '-', "00000001000000.000000:000", "20240229000000.000000+000"},
      {kUTC, "20070315143000.750000+000", '-', "00000000000001.250000:000", "20070315142959.500000+000"},
      {kBerlin, "20070715143000.000000+060", '-', "00000000010000.000000:000", "20070715133000.000000+060"},
      {kBerlin, "20080115143000.000000+060", '-', "00000184000000.000000:000", "20070715143000.000000+060"},
  };
  for (TArithmeticRow const& row : rows) ExpectResult(row);
}

TEST_F(TCIMDateTimeTest, IntervalMinusTimestampIsATimestampWithTheMicrosecondsCrosswise) {
  TArithmeticRow const rows[] = {
      {kUTC, "00000001020304.000000:000", '-', "20070316163304.000000-300", "20070315143000.000000-300"},
      {kUTC, "00000000000000.000000:000", '-', "20070315143000.000000+060", "20070315143000.000000+060"},
      {kUTC, "00000000000001.750000:000", '-', "20070315143000.250000+000", "20070315142959.500000+000"},
      {kUTC, "00000000000001.250000:000", '-', "20070315143000.750000+000", "20070315142958.500000+000"},
      {kBerlin, "00000000010000.000000:000", '-', "20070715143000.000000+060", "20070715133000.000000+060"},
  };
  for (TArithmeticRow const& row : rows) ExpectResult(row);
}

TEST_F(TCIMDateTimeTest, TimestampMinusALongerIntervalLosesTheSignOfTheSecondsOnly) {
  TArithmeticRow const rows[] = {
      // One hour before the epoch becomes one hour after it.
      {kUTC, "19700101010000.000000+000", '-', "00000000020000.000000:000", "19700101010000.000000+000"},
      {kUTC, "19700101010000.750000+000", '-', "00000000020000.250000:000", "19700101010000.500000+000"},
      {kUTC, "19700101010000.250000+000", '-', "00000000020000.750000:000", "19700101005959.500000+000"},
      {kUTC, "00000000020000.750000:000", '-', "19700101010000.250000+000", "19700101010000.500000+000"},
      {kUTC, "19600101000000.000000+000", '-', "00000000000000.000000:000", "19800102000000.000000+000"},
  };
  for (TArithmeticRow const& row : rows) ExpectResult(row);
}

TEST_F(TCIMDateTimeTest, TheEpochDateCountsAsTheEpochWhenMktimeReturnsMinusOne) {
  TArithmeticRow const rows[] = {
      {kEastHour, "19700101005959.000000+000", '+', "00000000000010.000000:000", "19700101010010.000000+000"},
      {kEastHour, "00000000000010.000000:000", '+', "19700101005959.000000+000", "19700101010010.000000+000"},
      {kEastHour, "19700101005958.000000+000", '+', "00000000000012.000000:000", "19700101010010.000000+000"},
      {kEastHour, "19700101005959.000000+000", '-', "00000000000010.000000:000", "19700101010010.000000+000"},
      {kEastHour, "00000000000010.000000:000", '-', "19700101005959.000000+000", "19700101010010.000000+000"},
  };
  for (TArithmeticRow const& row : rows) ExpectResult(row);
}

TEST_F(TCIMDateTimeTest, SettingAnIntervalKeepsTheFieldsOnlyATimestampHas) {
  TCIMDateTime value = At("20070315143000.000000+060");
  value.Set(1, 2, 3, 4, 5);
  EXPECT_EQ(value.ToString(), "00000001020304.000005:000");
  EXPECT_EQ(value.GetYear(), 2007);
  EXPECT_EQ(value.GetMonth(), 3);
  EXPECT_EQ(value.GetUTCOffset(), 60);
}

TEST_F(TCIMDateTimeTest, ASumBeforeTheEpochIsMirroredToAfterTheEpoch) {
  ExpectResult({kUTC, "19691231000000.000000+000", '+', "00000000010000.000000:000", "19700101230000.000000+000"});
}

// When the seconds cancel out, a negative fraction remains, which wraps around when it is stored.
TEST_F(TCIMDateTimeTest, NegativeFractionOfASecondWrapsAround) {
  TCIMDateTime const timestamp = At("19700101010000.250000+000"), interval = At("00000000010000.750000:000");
  EXPECT_EQ((timestamp - interval).GetMicroSeconds(), 4294467296u);
  EXPECT_EQ((timestamp - interval).ToString(), "19700101000000.4294467296+000");
  EXPECT_EQ((interval - timestamp).ToString(), "19700101000000.500000+000");
  EXPECT_EQ((At("19691231235958.250000+000") + At("00000000000000.000000:000")).ToString(), "19700101000001.4294217296+000");
}

// A result in daylight saving time is moved back by an hour, even if that gives a wrong time.
TEST_F(TCIMDateTimeTest, ResultsInDaylightSavingAreMovedBackByAnHour) {
  TArithmeticRow const rows[] = {
      // A result in the first hour of summer time: an hour earlier is winter time, when clocks are another hour back.
      {kBerlin, "20070325013000.000000+060", '+', "00000000010000.000000:000", "20070325013000.000000+060"},
      {kBerlin, "20070325013000.000000+060", '+', "00000000020000.000000:000", "20070325033000.000000+060"},
      // Where summer time shifts by half an hour, half an hour is lost.
      {kLordHowe, "20070115143000.000000+630", '+', "00000000000000.000000:000", "20070115140000.000000+630"},
      {kLordHowe, "20070715143000.000000+630", '+', "00000000000000.000000:000", "20070715143000.000000+630"},
  };
  for (TArithmeticRow const& row : rows) ExpectResult(row);
}

TEST_F(TCIMDateTimeTest, GetDifferenceIsNotImplemented) {
  TCIMDateTime a = At("20070315143000.000000+060"), b = At("20070315143000.000000+060");
  EXPECT_STATUS(TCIMDateTime::GetDifference(a, b), kZEPStatusNotImplemented);
}

}  // namespace
}  // namespace NQRVZEP20
