// SPDX-License-Identifier: Apache-2.0
#include "TCIMDateTimeImpl.h"

#include "TZEPException.h"
#include "cim/value/StandardTime.h"

#include <cstdlib>
#include <cstring>
#include <ctime>
#include <optional>
#include <string_view>

namespace NQRVZEP20 {
namespace {

constexpr std::int64_t kMicroSecondsPerSecond = 1000000;

void CheckOrThrow(bool isGood) {
  if (!isGood) throw TZEPException(kZEPStatusInvalidDateTime);
}

// ---- Time ----

bool IsEpochDate(unsigned short year, unsigned short month, unsigned int day) { return year == 1970 && month == 1 && day == 1; }

// The days from 1 March to the first of each month, less one: the table saves a third of a conversion's arithmetic.
constexpr int kDaysFromMarch[] = {0, 305, 336, -1, 30, 60, 91, 121, 152, 183, 213, 244, 274};

// The days from 1 January 1970. The month may be out of range, and the day may be any.
std::int64_t DaysOf(int year, int month, int day) {
  if (month < 1 || month > 12) {
    year += (month + 11) / 12 - 1;
    month = (month + 11) % 12 + 1;
  }
  // A year from March to February ends in its leap day. 400 years later, no year is negative, and all days are the same.
  auto const sinceMarch = static_cast<unsigned int>(year + 400 - (month <= 2 ? 1 : 0));
  unsigned int const centuries = sinceMarch / 100;
  unsigned int const days = 1461 * sinceMarch / 4 - centuries + centuries / 4;
  constexpr int kFrom400BeforeZeroTo1970 = 719468 + 146097;
  return std::int64_t{day} + (static_cast<int>(days) + kDaysFromMarch[month] - kFrom400BeforeZeroTo1970);
}

[[gnu::cold]] std::int64_t TimeByMktime(int year, int month, int day, int hour, int minute, int second) {
  std::tm record{};
  record.tm_year = year - 1900;
  record.tm_mon = month - 1;
  record.tm_mday = day;
  record.tm_hour = hour;
  record.tm_min = minute;
  record.tm_sec = second;
  return std::mktime(&record);
}

// A local time as the seconds that it would have since 1970 in UTC.
std::int64_t LocalSeconds(int year, int month, int day, int hour, int minute, int second) {
  return DaysOf(year, month, day) * 86400 + hour * 3600 + minute * 60 + second;
}

// What mktime returns for a local time in standard time, whose fields may be out of range. mktime itself takes up to 3000 ns;
// TStandardTime knows nearly all of its results.
std::int64_t TimeOf(TStandardTime const& zone, int year, int month, int day, int hour, int minute, int second) {
  std::int64_t const local = LocalSeconds(year, month, day, hour, minute, second);
  if (std::optional<std::int64_t> const time = zone.TimeOf(local)) return *time;
  return TimeByMktime(year, month, day, hour, minute, second);
}

std::int64_t LocalSecondsOf(TCIMDateTimeImpl const& timestamp) {
  auto const day = static_cast<int>(timestamp.GetDay());
  return LocalSeconds(timestamp.GetYear(), timestamp.GetMonth(), day, timestamp.GetHour(),
                      timestamp.GetMinute() - timestamp.GetUTCOffset(), timestamp.GetSecond());
}

// `utcOffset` is subtracted from the minutes: pass that of the timestamp to get the instant that it denotes, or 0 to read its
// fields as local time. When mktime returns -1, a date of 1 January 1970 counts as the epoch.
std::int64_t SecondsOf(TCIMDateTimeImpl const& timestamp, int utcOffset, TStandardTime const& zone) {
  auto const day = static_cast<int>(timestamp.GetDay());
  std::int64_t const time = TimeOf(zone, timestamp.GetYear(), timestamp.GetMonth(), day, timestamp.GetHour(),
                                   timestamp.GetMinute() - utcOffset, timestamp.GetSecond());
  if (time != -1) return time;
  CheckOrThrow(IsEpochDate(timestamp.GetYear(), timestamp.GetMonth(), timestamp.GetDay()));
  return 0;
}

std::tm LocalTime(std::time_t time) {
  ::tzset();
  std::tm record;
  CheckOrThrow(::localtime_r(&time, &record) != nullptr);
  return record;
}

// 64-bit sums and products that wrap around when intervals of hundreds of millions of days overflow them.
std::int64_t WrappingSum(std::int64_t a, std::int64_t b) {
  return static_cast<std::int64_t>(static_cast<std::uint64_t>(a) + static_cast<std::uint64_t>(b));
}

std::int64_t TotalOf(std::int64_t seconds, std::int64_t microSeconds) {
  return WrappingSum(static_cast<std::int64_t>(static_cast<std::uint64_t>(seconds) * kMicroSecondsPerSecond), microSeconds);
}

std::uint64_t Magnitude(std::int64_t total) {
  return total < 0 ? -static_cast<std::uint64_t>(total) : static_cast<std::uint64_t>(total);
}

// ---- Text ----

constexpr std::size_t kTextLength = 25;  // the character at 14, the point, is not checked
constexpr std::size_t kSignPosition = 21;

bool IsDigit(char c) { return c >= '0' && c <= '9'; }

// Digits are the bytes 0x30 to 0x39: adding 6 does not carry into their upper halves.
bool AreFourDigits(char const* text) {
  std::uint32_t bytes;
  std::memcpy(&bytes, text, sizeof bytes);
  return (bytes & 0xf0f0f0f0) == 0x30303030 && ((bytes + 0x06060606) & 0xf0f0f0f0) == 0x30303030;
}

// Checking four characters at a time, some of them twice, saves a fifth of the time to parse a text.
bool IsWellFormed(std::string_view text) {
  if (text.size() != kTextLength) return false;
  for (std::size_t const at : {0, 4, 8, 10, 15, 17})  // up to the point, and from there to the sign
    if (!AreFourDigits(text.data() + at)) return false;
  for (std::size_t const at : {22, 23, 24})
    if (!IsDigit(text[at])) return false;
  return text[kSignPosition] == '+' || text[kSignPosition] == '-' || text[kSignPosition] == ':';
}

// The number in a slice of a well-formed text.
template <class T>
T NumberIn(std::string_view text, std::size_t from, std::size_t length) {
  unsigned int number = 0;
  for (char const digit : text.substr(from, length)) number = number * 10 + static_cast<unsigned int>(digit - '0');
  return static_cast<T>(number);
}

constexpr char kPairs[] =
    "00010203040506070809101112131415161718192021222324252627282930313233343536373839404142434445464748495051525354555657585960"
    "616263646566676869707172737475767778798081828384858687888990919293949596979899";

constexpr unsigned int PowerOfTen(int exponent) { return exponent == 0 ? 1 : 10 * PowerOfTen(exponent - 1); }

// Builds a text from decimal numbers, each padded with zeros to a width. A number with more digits is not shortened.
class TDigits {
public:
  template <int kWidth>
  TDigits& Number(unsigned int number) {
    // Two digits at a time, and a width that the compiler knows, take a third of the time.
    if (number >= PowerOfTen(kWidth)) return WiderNumber(number);
    unsigned int rest = number;
    for (int at = kWidth; at > 0; at -= 2, rest /= 100) {
      if (at >= 2)
        std::memcpy(fEnd + at - 2, &kPairs[rest % 100 * 2], 2);
      else
        *fEnd = static_cast<char>('0' + rest);
    }
    fEnd += kWidth;
    return *this;
  }
  TDigits& Text(std::string_view text) {
    fEnd += text.copy(fEnd, text.size());
    return *this;
  }
  std::string ToString() const { return {fText, static_cast<std::size_t>(fEnd - fText)}; }

private:
  // With at least one digit more than its width.
  [[gnu::cold]] TDigits& WiderNumber(unsigned int number) { return Text(std::to_string(number)); }

  char fText[64];  // the widest possible fields need 52
  char* fEnd = fText;
};

void AppendCount(std::string& text, unsigned int count, char const* unit) {
  if (count == 0) return;
  text += std::to_string(count) + ' ' + unit + (count == 1 ? " " : "s ");
}

}  // namespace

// ---- Setting ----

bool TCIMDateTimeImpl::IsValid(unsigned int, unsigned short hours, unsigned short minutes, unsigned short seconds,
                               unsigned int microSeconds) {
  return hours <= 23 && minutes < 60 && seconds < 60 && microSeconds <= 999999;
}

bool TCIMDateTimeImpl::IsValid(unsigned short year, unsigned short month, unsigned int day, unsigned short hour,
                               unsigned short minute, unsigned short second, unsigned int, short utcOffset) {
  if (IsEpochDate(year, month, day)) return true;

  // mktime fails for a local time that the zone skipped when it changed its standard time.
  return TimeOf(TStandardTime::OfZone(), year, month, static_cast<int>(day), hour, minute - utcOffset, second) != -1;
}

void TCIMDateTimeImpl::Set(std::string const& text) {
  CheckOrThrow(IsWellFormed(text));
  using TShort = unsigned short;
  auto const hour = NumberIn<TShort>(text, 8, 2);
  auto const minute = NumberIn<TShort>(text, 10, 2);
  auto const second = NumberIn<TShort>(text, 12, 2);
  auto const microSeconds = NumberIn<unsigned int>(text, 15, 6);
  if (text[kSignPosition] == ':') return Set(NumberIn<unsigned int>(text, 0, 8), hour, minute, second, microSeconds);

  auto const minutesFromUTC = NumberIn<int>(text, 22, 3);
  auto const utcOffset = static_cast<short>(text[kSignPosition] == '-' ? -minutesFromUTC : minutesFromUTC);
  Set(NumberIn<TShort>(text, 0, 4), NumberIn<TShort>(text, 4, 2), NumberIn<unsigned int>(text, 6, 2), hour, minute, second,
      microSeconds, utcOffset);
}

void TCIMDateTimeImpl::Set(unsigned int days, unsigned short hours, unsigned short minutes, unsigned short seconds,
                           unsigned int microSeconds) {
  CheckOrThrow(IsValid(days, hours, minutes, seconds, microSeconds));
  fIsNull = false;
  fDay = days;
  fHour = hours;
  fMinute = minutes;
  fSecond = seconds;
  fMicroSeconds = microSeconds;
  fIsInterval = true;
}

void TCIMDateTimeImpl::Set(unsigned short year, unsigned short month, unsigned int day, unsigned short hour,
                           unsigned short minute, unsigned short second, unsigned int microSeconds, short utcOffset) {
  CheckOrThrow(IsValid(year, month, day, hour, minute, second, microSeconds, utcOffset));
  fIsNull = false;
  fYear = year;
  fMonth = month;
  fDay = day;
  fHour = hour;
  fMinute = minute;
  fSecond = second;
  fMicroSeconds = microSeconds;
  fUTCOffset = utcOffset;
  fIsInterval = false;
}

// ---- Text ----

std::string TCIMDateTimeImpl::ToString() const {
  CheckOrThrow(!fIsNull);
  TDigits text;
  if (fIsInterval)
    text.Number<8>(fDay);
  else
    text.Number<4>(fYear).Number<2>(fMonth).Number<2>(fDay);
  text.Number<2>(fHour).Number<2>(fMinute).Number<2>(fSecond).Text(".").Number<6>(fMicroSeconds);
  if (fIsInterval)
    text.Text(":000");
  else
    text.Text(fUTCOffset >= 0 ? "+" : "-").Number<3>(static_cast<unsigned int>(std::abs(fUTCOffset)));
  return text.ToString();
}

std::string TCIMDateTimeImpl::ToUIString() const {
  CheckOrThrow(!fIsNull);
  if (!fIsInterval) {
    TDigits text;
    text.Number<2>(fMonth).Text("/").Number<2>(fDay).Text("/").Number<4>(fYear).Text(" ");
    text.Number<2>(fHour).Text(":").Number<2>(fMinute).Text(":").Number<2>(fSecond);
    return text.ToString();
  }
  std::string text;
  AppendCount(text, fDay, "day");
  AppendCount(text, fHour, "hour");
  AppendCount(text, fMinute, "minute");
  AppendCount(text, fSecond, "second");
  AppendCount(text, fMicroSeconds / 1000, "millisecond");
  AppendCount(text, fMicroSeconds % 1000, "microsecond");
  return text;
}

// ---- Seconds ----

std::int64_t TCIMDateTimeImpl::SecondsOfTimestamp(int utcOffset) const {
  return SecondsOf(*this, utcOffset, TStandardTime::OfZone());
}

std::int64_t TCIMDateTimeImpl::SecondsOfInterval() const {
  return std::int64_t{fDay} * 86400 + fHour * 3600 + fMinute * 60 + fSecond;
}

// The seconds that arithmetic uses: the UTC offset is not applied.
std::int64_t TCIMDateTimeImpl::Seconds() const { return fIsInterval ? SecondsOfInterval() : SecondsOfTimestamp(0); }

// ---- Comparison ----

std::pair<std::int64_t, unsigned int> TCIMDateTimeImpl::OrderingKey() const {
  return {fIsInterval ? SecondsOfInterval() : SecondsOfTimestamp(fUTCOffset), fMicroSeconds};
}

bool TCIMDateTimeImpl::operator==(TCIMDateTimeImpl const& other) const {
  CheckOrThrow(!fIsNull && !other.fIsNull && fIsInterval == other.fIsInterval);
  return OrderingKey() == other.OrderingKey();
}

bool TCIMDateTimeImpl::operator<(TCIMDateTimeImpl const& other) const {
  CheckOrThrow(!fIsNull && !other.fIsNull && fIsInterval == other.fIsInterval);
  if (fIsInterval) return OrderingKey() < other.OrderingKey();

  // Nearly all timestamps have the order of their local times. This takes half of the time of two conversions.
  TStandardTime const& zone = TStandardTime::OfZone();
  std::int64_t left = LocalSecondsOf(*this), right = LocalSecondsOf(other);
  if (!zone.HaveSameOffset(left, right)) {
    left = SecondsOf(*this, fUTCOffset, zone);
    right = SecondsOf(other, other.fUTCOffset, zone);
  }
  return left != right ? left < right : fMicroSeconds < other.fMicroSeconds;
}

// ---- Arithmetic ----

TCIMDateTimeImpl TCIMDateTimeImpl::IntervalOf(std::int64_t total) {
  std::uint64_t const microSeconds = Magnitude(total);
  std::uint64_t const seconds = microSeconds / kMicroSecondsPerSecond;
  std::uint64_t const minutes = seconds / 60;
  std::uint64_t const hours = minutes / 60;
  TCIMDateTimeImpl interval;
  interval.Set(static_cast<unsigned int>(hours / 24), static_cast<unsigned short>(hours % 24),
               static_cast<unsigned short>(minutes % 60), static_cast<unsigned short>(seconds % 60),
               static_cast<unsigned int>(microSeconds % kMicroSecondsPerSecond));
  return interval;
}

// The timestamp's fields are in standard time and are not validated: for a negative total the seconds lose their sign, and
// the microseconds wrap around to a number above four thousand million. Kept.
TCIMDateTimeImpl TCIMDateTimeImpl::TimestampOf(std::int64_t total, short utcOffset) {
  std::int64_t const seconds = std::abs(total / kMicroSecondsPerSecond);
  std::tm record = LocalTime(seconds);
  if (record.tm_isdst > 0) record = LocalTime(seconds - 3600);

  TCIMDateTimeImpl timestamp;
  timestamp.fIsNull = false;
  timestamp.fYear = static_cast<unsigned short>(record.tm_year + 1900);
  timestamp.fMonth = static_cast<unsigned short>(record.tm_mon + 1);
  timestamp.fDay = static_cast<unsigned int>(record.tm_mday);
  timestamp.fHour = static_cast<unsigned short>(record.tm_hour);
  timestamp.fMinute = static_cast<unsigned short>(record.tm_min);
  timestamp.fSecond = static_cast<unsigned short>(record.tm_sec);
  timestamp.fMicroSeconds = static_cast<unsigned int>(total % kMicroSecondsPerSecond);
  timestamp.fUTCOffset = utcOffset;
  return timestamp;
}

TCIMDateTimeImpl TCIMDateTimeImpl::operator+(TCIMDateTimeImpl const& other) const {
  CheckOrThrow(!fIsNull && !other.fIsNull && (fIsInterval || other.fIsInterval));
  std::int64_t const total = TotalOf(Seconds() + other.Seconds(), std::int64_t{fMicroSeconds} + other.fMicroSeconds);
  if (fIsInterval && other.fIsInterval) return IntervalOf(total);
  return TimestampOf(total, fIsInterval ? other.fUTCOffset : fUTCOffset);
}

TCIMDateTimeImpl TCIMDateTimeImpl::operator-(TCIMDateTimeImpl const& other) const {
  CheckOrThrow(!fIsNull && !other.fIsNull);
  std::int64_t const microSeconds = std::int64_t{fMicroSeconds} - other.fMicroSeconds;
  if (fIsInterval && other.fIsInterval) return IntervalOf(TotalOf(Seconds() - other.Seconds(), microSeconds));
  if (!fIsInterval && !other.fIsInterval) return IntervalOf(TotalOf(Instant() - other.Instant(), microSeconds));

  // Only the difference of the seconds loses its sign. For interval - timestamp the microseconds therefore enter crosswise:
  // the timestamp's are subtracted from the interval's. Kept.
  return TimestampOf(TotalOf(std::abs(Seconds() - other.Seconds()), microSeconds), fIsInterval ? other.fUTCOffset : fUTCOffset);
}

// The instant that a timestamp denotes, in seconds.
std::int64_t TCIMDateTimeImpl::Instant() const { return SecondsOfTimestamp(0) - fUTCOffset * 60; }

}  // namespace NQRVZEP20
