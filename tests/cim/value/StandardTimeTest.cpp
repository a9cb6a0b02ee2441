// SPDX-License-Identifier: Apache-2.0
#include "cim/value/StandardTime.h"

#include "TCIMDateTime.h"
#include "TCIMDateTimeImpl.h"
#include "tests/Support.h"

#include <algorithm>
#include <ctime>
#include <limits>
#include <optional>
#include <random>

namespace NQRVZEP20 {
namespace {

using TShort = unsigned short;

// TCIMDateTime uses mktime only for few times. Each result must be that of mktime.
class StandardTimeTest : public testing::Test {
protected:
  int Pick(int from, int to) { return std::uniform_int_distribution<int>(from, to)(fRandom); }
  bool OneIn(int count) { return Pick(1, count) == 1; }

  // A local time near a change of the zone's UTC offset, or any local time. Its fields may be out of range.
  TCIMDateTime SomeTime(short utcOffset);

  std::mt19937 fRandom{20070315};
};

std::tm RecordOf(TCIMDateTime const& time, int utcOffset) {
  std::tm record{};
  record.tm_year = time.GetYear() - 1900, record.tm_mon = time.GetMonth() - 1, record.tm_mday = static_cast<int>(time.GetDay());
  record.tm_hour = time.GetHour(), record.tm_min = time.GetMinute() - utcOffset, record.tm_sec = time.GetSecond();
  return record;
}

// mktime's result; empty when it fails. As documented, a date of 1 January 1970 counts as the epoch then.
std::optional<std::int64_t> SecondsOf(TCIMDateTime const& time, int utcOffset) {
  std::tm record = RecordOf(time, utcOffset);
  std::time_t const seconds = std::mktime(&record);
  if (seconds != -1) return seconds;
  if (time.GetYear() == 1970 && time.GetMonth() == 1 && time.GetDay() == 1) return 0;
  return std::nullopt;
}

bool HaveSameOffset(std::time_t a, std::time_t b) {
  std::tm one, other;
  ::localtime_r(&a, &one);
  ::localtime_r(&b, &other);
  return one.tm_gmtoff == other.tm_gmtoff && one.tm_isdst == other.tm_isdst;
}

// The next change of the UTC offset, when there is one within two years.
std::time_t NextChange(std::time_t from) {
  std::time_t constexpr kStep = 10 * 86400;
  std::time_t to = from + kStep;
  for (int steps = 0; steps < 73 && HaveSameOffset(from, to); ++steps) from = to, to += kStep;
  while (to - from > 1) (HaveSameOffset(from, (from + to) / 2) ? from : to) = (from + to) / 2;
  return to;
}

TCIMDateTime TimestampOf(std::tm const& fields, short utcOffset) {
  return TCIMDateTime(static_cast<TShort>(fields.tm_year + 1900), static_cast<TShort>(fields.tm_mon + 1),
                      static_cast<unsigned int>(fields.tm_mday), static_cast<TShort>(fields.tm_hour),
                      static_cast<TShort>(fields.tm_min), static_cast<TShort>(fields.tm_sec), 0, utcOffset);
}

// A timestamp that the zone does not accept is made in UTC, where only one second is invalid.
TCIMDateTime FieldsOf(std::tm const& fields, short utcOffset) {
  try {
    return TimestampOf(fields, utcOffset);
  } catch (TZEPException const&) {
    TEnvironmentGuard const zone("TZ", "UTC0");
    return TimestampOf(fields, utcOffset);
  }
}

TCIMDateTime StandardTimeTest::SomeTime(short utcOffset) {
  std::tm fields{};
  if (OneIn(4)) {
    fields.tm_year = (OneIn(3) ? Pick(0, 65535) : Pick(1900, 2100)) - 1900, fields.tm_mon = Pick(-1, 14);
    fields.tm_mday = Pick(0, 40), fields.tm_hour = Pick(0, 30), fields.tm_min = Pick(0, 70), fields.tm_sec = Pick(0, 70);
    return FieldsOf(fields, utcOffset);
  }
  std::time_t time = NextChange(std::time_t{86400} * Pick(-36500, 47500));
  time += OneIn(2) ? Pick(-4 * 3600, 4 * 3600) : Pick(-12 * 86400, 12 * 86400);
  (OneIn(2) ? ::localtime_r : ::gmtime_r)(&time, &fields);
  fields.tm_min += utcOffset >= 0 ? utcOffset : 0;  // close to the change also as an instant
  return FieldsOf(fields, utcOffset);
}

std::string TextOf(std::optional<std::int64_t> const& seconds) { return seconds ? std::to_string(*seconds) : "none"; }

// The implementation's seconds of a local time, relative to those of 2 January 2001, where no zone changes its UTC offset.
std::optional<std::int64_t> DistanceOf(TCIMDateTime const& time) {
  TCIMDateTime const base(2001, 1, 2, 3, 4, 5, 0, 0);
  try {
    TCIMDateTime const distance = time - base;
    return std::int64_t{distance.GetDay()} * 86400 + distance.GetHour() * 3600 + distance.GetMinute() * 60 + distance.GetSecond();
  } catch (TZEPException const&) {
    return std::nullopt;
  }
}

std::optional<std::int64_t> DistanceByMktime(TCIMDateTime const& time) {
  std::optional<std::int64_t> const seconds = SecondsOf(time, 0);
  if (!seconds) return std::nullopt;
  return std::abs(*seconds - *SecondsOf(TCIMDateTime(2001, 1, 2, 3, 4, 5, 0, 0), 0));
}

// mktime starts its search at the UTC offset that it found last, and where clocks were put back may find either time.
template <class TResult>
void ExpectOneOf(TResult const& actual, TResult const& before, TResult const& after, std::string const& what) {
  EXPECT_TRUE(actual == before || actual == after) << what;
}

void ExpectTheTimeOfMktime(TCIMDateTime const& time) {
  auto const before = DistanceByMktime(time), actual = DistanceOf(time), after = DistanceByMktime(time);
  ExpectOneOf(actual, before, after, time.ToString() + " is " + TextOf(actual) + ", by mktime " + TextOf(before));
}

bool IsValid(TCIMDateTime const& time) {
  return TCIMDateTimeImpl::IsValid(time.GetYear(), time.GetMonth(), time.GetDay(), time.GetHour(), time.GetMinute(),
                                   time.GetSecond(), 0, time.GetUTCOffset());
}

void ExpectTheValidityOfMktime(TCIMDateTime const& time) {
  int const offset = time.GetUTCOffset();
  bool const before = SecondsOf(time, offset).has_value(), actual = IsValid(time), after = SecondsOf(time, offset).has_value();
  ExpectOneOf(actual, before, after, time.ToString() + (actual ? " is valid" : " is invalid"));
}

// -1, 0 or 1; 2 when there is no order.
int OrderOf(TCIMDateTime const& a, TCIMDateTime const& b) {
  try {
    return a < b ? -1 : a == b ? 0 : 1;
  } catch (TZEPException const&) {
    return 2;
  }
}

int OrderByMktime(TCIMDateTime const& a, TCIMDateTime const& b) {
  auto const left = SecondsOf(a, a.GetUTCOffset()), right = SecondsOf(b, b.GetUTCOffset());
  if (!left || !right) return 2;
  return *left < *right ? -1 : *left == *right ? 0 : 1;
}

void ExpectTheOrderOfMktime(TCIMDateTime const& a, TCIMDateTime const& b) {
  int const before = OrderByMktime(a, b), actual = OrderOf(a, b), after = OrderByMktime(a, b);
  ExpectOneOf(actual, before, after, a.ToString() + " and " + b.ToString() + ": order " + std::to_string(actual));
}

// All zones of the system. The copies in posix/ and right/ are left out, except some that count leap seconds.
std::vector<std::string> Zones() {
  std::vector<std::string> zones = {"UTC0",
                                    "XST-1",
                                    "XST5",
                                    "XST24:59:59",
                                    "XST-24:59:59",
                                    "CET-1CEST,M3.5.0,M10.5.0/3",
                                    "LHST-10:30LHDT-11,M10.1.0,M4.1.0",
                                    "EST5EDT",
                                    "IST-1GMT0,M10.5.0,M3.5.0/1",
                                    "XST-1XDT,0/0,J365/49",
                                    "XST-1XDT,J10/0,J11/0",
                                    "XST-1XDT,J20/0,J10/0",
                                    "XST-1XDT-1,M3.5.0,M10.5.0/3",
                                    "<" + std::string(100, 'X') + ">-3",
                                    "",
                                    ":",
                                    "No/Such_Zone",
                                    ":Europe/Berlin",
                                    "/usr/share/zoneinfo/Asia/Tokyo",
                                    "/etc/passwd",
                                    "right/Europe/Berlin",
                                    "right/UTC"};
  std::filesystem::path const directory = "/usr/share/zoneinfo";
  if (!std::filesystem::exists(directory)) return zones;
  std::size_t const fixed = zones.size();
  for (auto entry = std::filesystem::recursive_directory_iterator(directory); entry != end(entry); ++entry) {
    std::string const name = entry->path().lexically_relative(directory);
    if (name == "posix" || name == "right") entry.disable_recursion_pending();
    if (entry->is_regular_file() && ReadFile(entry->path()).substr(0, 4) == "TZif") zones.push_back(name);
  }
  std::sort(zones.begin() + static_cast<std::ptrdiff_t>(fixed), zones.end());
  return zones;
}

TEST_F(StandardTimeTest, AgreesWithMktimeInAllZones) {
  for (std::string const& name : Zones()) {
    SCOPED_TRACE(name);
    TEnvironmentGuard const zone("TZ", name.c_str());
    ::tzset();
    for (int round = 0; round < 12; ++round) {
      ExpectTheTimeOfMktime(SomeTime(0));
      ExpectTheValidityOfMktime(SomeTime(static_cast<short>(Pick(-999, 999))));
      auto const offset = [&] { return static_cast<short>(OneIn(4) ? Pick(-32768, 32767) : Pick(-14, 14) * 60); };
      TCIMDateTime const time = SomeTime(offset());
      ExpectTheOrderOfMktime(time, SomeTime(offset()));
      std::tm near = RecordOf(time, 0);
      near.tm_hour += Pick(0, 2), near.tm_min += Pick(0, 1);
      ExpectTheOrderOfMktime(time, FieldsOf(near, time.GetUTCOffset()));
    }
    if (HasFailure()) break;
  }
}

TEST_F(StandardTimeTest, KnowsNearlyAllTimesWithoutMktime) {
  struct {
    char const* fZone;
    std::int64_t fUnknownDays;  // from 1972 to 2100
  } const rows[] = {{"UTC0", 8},
                    {"CET-1CEST,M3.5.0,M10.5.0/3", 9},
                    {"Europe/Berlin", 0},
                    {"America/New_York", 0},
                    {"Asia/Kolkata", 0},
                    {"Asia/Kathmandu", 17},
                    {"Africa/Casablanca", 2000}};
  for (auto const& row : rows) {
    SCOPED_TRACE(row.fZone);
    NEEDS(std::filesystem::exists("/usr/share/zoneinfo/Europe/Berlin"), "the zones (package tzdata)");
    TEnvironmentGuard const zone("TZ", row.fZone);
    TStandardTime const& time = TStandardTime::OfZone();
    std::int64_t unknown = 0;
    for (std::int64_t day = 730; day < 47482; ++day) unknown += time.TimeOf(day * 86400) ? 0 : 1;
    EXPECT_LE(unknown, row.fUnknownDays);
  }
}

}  // namespace
}  // namespace NQRVZEP20
