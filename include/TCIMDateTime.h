// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "ZEPExport.h"

#include <boost/shared_ptr.hpp>

#include <string>

namespace NQRVZEP20 {

class TCIMDateTimeImpl;

// A CIM datetime: a point in time with a UTC offset (a timestamp), or a length of time (an interval).
//
// A plain value: copies are deep and share nothing. A default-constructed one is NULL; printing, comparing or adding a NULL
// throws kZEPStatusInvalidDateTime. Not synchronised: use one object from one thread at a time. Validation, comparison and
// arithmetic of timestamps use mktime and localtime of the C library and therefore depend on the time zone of the process.
class ZEP_EXPORT TCIMDateTime {
public:
  TCIMDateTime();
  TCIMDateTime(std::string const& text);
  TCIMDateTime(unsigned int days, unsigned short hours, unsigned short minutes, unsigned short seconds,
               unsigned int microSeconds);
  TCIMDateTime(unsigned short year, unsigned short month, unsigned int day, unsigned short hour, unsigned short minute,
               unsigned short second, unsigned int microSeconds, short utcOffset);
  TCIMDateTime(TCIMDateTime const& other);
  TCIMDateTime& operator=(TCIMDateTime const& other);
  ~TCIMDateTime();

  // ---- Setting. A Set with invalid arguments throws kZEPStatusInvalidDateTime and keeps the old value. ----

  // Parses the 25-character CIM text: "yyyymmddHHMMSS.mmmmmm+uuu" (or "-uuu"; minutes east of UTC) for a timestamp,
  // "ddddddddHHMMSS.mmmmmm:000" for an interval.
  void Set(std::string const& text);

  // Makes this an interval. `days` has no limit; `hours` is 0 to 23, `minutes` and `seconds` 0 to 59,
  // `microSeconds` 0 to 999999.
  void Set(unsigned int days, unsigned short hours, unsigned short minutes, unsigned short seconds, unsigned int microSeconds);

  // Makes this a timestamp; `utcOffset` is in minutes east of UTC. The fields are valid when mktime can convert them; mktime
  // normalises fields that are out of range, so month 13 and second 75 are valid. 1 January 1970 is valid at any time of day.
  // `microSeconds` is not checked. Kept.
  void Set(unsigned short year, unsigned short month, unsigned int day, unsigned short hour, unsigned short minute,
           unsigned short second, unsigned int microSeconds, short utcOffset);

  void SetPrecision(bool precision);  // stored for GetPrecision; affects neither text nor comparison
  void Clear();                       // makes this NULL

  // ---- Fields. The fields of a NULL datetime have no meaning. ----

  bool IsNull() const;
  bool IsInterval() const;
  unsigned short GetYear() const;
  unsigned short GetMonth() const;  // 1 to 12
  unsigned int GetDay() const;      // the day of the month, or the number of days of an interval
  unsigned short GetHour() const;
  unsigned short GetMinute() const;
  unsigned short GetSecond() const;
  unsigned int GetMicroSeconds() const;
  short GetUTCOffset() const;  // minutes east of UTC
  bool GetPrecision() const;
  boost::shared_ptr<TCIMDateTimeImpl> GetBody() const;  // shared, not a copy: changing it changes this datetime

  // ---- Text ----

  std::string ToString() const;  // the 25-character CIM text; longer when a field has too many digits

  // A human-readable text: "03/15/2007 14:30:00" (no microseconds, no offset), or "2 days 1 hour 5 milliseconds " for an
  // interval, with the trailing blank. The text of a zero interval is empty.
  std::string ToUIString() const;

  // ---- Comparison ----

  // Timestamps are compared by the instant that they represent, then by microseconds; intervals by their length. All throw
  // kZEPStatusInvalidDateTime when either is NULL, or when one is a timestamp and the other an interval.

  bool operator==(TCIMDateTime const& other) const;
  bool operator<(TCIMDateTime const& other) const;

  // ---- Arithmetic. The operands do not change. Throws kZEPStatusInvalidDateTime when either is NULL or when the C library
  //      cannot convert the time. A resulting timestamp before 1970 has no meaning: its seconds since 1970 lose their sign,
  //      and its microseconds may exceed 999999. Kept. ----

  // Interval + interval gives an interval. Timestamp + interval, in either order, gives a timestamp with the UTC offset of
  // the timestamp. Adding two timestamps throws kZEPStatusInvalidDateTime.
  TCIMDateTime operator+(TCIMDateTime const& other) const;

  // The difference of two timestamps or of two intervals is an interval without a sign. Timestamp - interval, and also
  // interval - timestamp, gives a timestamp with the UTC offset of the timestamp. Kept.
  TCIMDateTime operator-(TCIMDateTime const& other) const;

  static TCIMDateTime GetDifference(TCIMDateTime& a, TCIMDateTime& b);  // always throws kZEPStatusNotImplemented

private:
  boost::shared_ptr<TCIMDateTimeImpl> fBody;  // never null, never shared between two datetimes
};

}  // namespace NQRVZEP20
