// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "ZEPExport.h"

#include <cstdint>
#include <string>
#include <utility>

namespace NQRVZEP20 {

// The implementation of a TCIMDateTime: its fields and the rules for them. Use TCIMDateTime, which documents every operation;
// this class is public because TCIMDateTime::GetBody returns it.
//
// A plain value; a new one is NULL. Not synchronised.
class ZEP_EXPORT TCIMDateTimeImpl {
public:
  // Whether Set would accept these fields.
  static bool IsValid(unsigned int days, unsigned short hours, unsigned short minutes, unsigned short seconds,
                      unsigned int microSeconds);
  static bool IsValid(unsigned short year, unsigned short month, unsigned int day, unsigned short hour, unsigned short minute,
                      unsigned short second, unsigned int microSeconds, short utcOffset);

  void Set(std::string const& text);
  void Set(unsigned int days, unsigned short hours, unsigned short minutes, unsigned short seconds, unsigned int microSeconds);
  void Set(unsigned short year, unsigned short month, unsigned int day, unsigned short hour, unsigned short minute,
           unsigned short second, unsigned int microSeconds, short utcOffset);
  void SetPrecision(bool precision) { fPrecision = precision; }
  void Clear() { fIsNull = true; }

  bool IsNull() const { return fIsNull; }
  bool IsInterval() const { return fIsInterval; }
  unsigned short GetYear() const { return fYear; }
  unsigned short GetMonth() const { return fMonth; }
  unsigned int GetDay() const { return fDay; }
  unsigned short GetHour() const { return fHour; }
  unsigned short GetMinute() const { return fMinute; }
  unsigned short GetSecond() const { return fSecond; }
  unsigned int GetMicroSeconds() const { return fMicroSeconds; }
  short GetUTCOffset() const { return fUTCOffset; }
  bool GetPrecision() const { return fPrecision; }

  std::string ToString() const;
  std::string ToUIString() const;

  bool operator==(TCIMDateTimeImpl const& other) const;
  bool operator<(TCIMDateTimeImpl const& other) const;
  TCIMDateTimeImpl operator+(TCIMDateTimeImpl const& other) const;
  TCIMDateTimeImpl operator-(TCIMDateTimeImpl const& other) const;

private:
  // Convert a total in microseconds to the result of an operation.
  static TCIMDateTimeImpl IntervalOf(std::int64_t total);
  static TCIMDateTimeImpl TimestampOf(std::int64_t total, short utcOffset);

  std::int64_t Seconds() const;
  std::int64_t SecondsOfTimestamp(int utcOffset) const;
  std::int64_t SecondsOfInterval() const;
  std::int64_t Instant() const;
  std::pair<std::int64_t, unsigned int> OrderingKey() const;

  bool fIsNull = true;
  unsigned short fYear = 0;   // timestamps
  unsigned short fMonth = 0;  // timestamps; 1 to 12
  unsigned int fDay = 0;      // the day of the month of a timestamp, the number of days of an interval
  unsigned short fHour = 0;
  unsigned short fMinute = 0;
  unsigned short fSecond = 0;
  unsigned int fMicroSeconds = 0;
  short fUTCOffset = 0;  // timestamps; minutes east of UTC
  bool fIsInterval = false;
  bool fPrecision = false;
};

}  // namespace NQRVZEP20
