#pragma once

#include "ZEPExport.h"

#include <boost/shared_ptr.hpp>

#include <string>

namespace NQRVZEP20 {

class TCIMDateTimeImpl;

// A CIM datetime: a point in time with a UTC offset (a timestamp), or a length of time (an interval).
//
// A plain value: copies are deep and share nothing. A new one is NULL; printing, comparing or adding a NULL throws
// kZEPStatusInvalidDateTime. Not synchronised: use one object from one thread at a time. Validation, comparison and
// arithmetic of timestamps go through the C library's mktime and localtime and so depend on the process's time zone.
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

  // ---- Setting. Each throws kZEPStatusInvalidDateTime for what it cannot take, and then keeps the old value. ----

  // Reads the 25-character CIM text: "yyyymmddHHMMSS.mmmmmm+uuu" (or "-uuu"; minutes east of UTC) for a timestamp,
  // "ddddddddHHMMSS.mmmmmm:000" for an interval.
  void Set(std::string const& text);

  // Makes this an interval. `days` has no limit; `hours` is 0 to 23, `minutes` and `seconds` 0 to 59,
  // `microSeconds` 0 to 999999.
  void Set(unsigned int days, unsigned short hours, unsigned short minutes, unsigned short seconds, unsigned int microSeconds);

  // Makes this a timestamp; `utcOffset` is in minutes east of UTC. Valid is what mktime can convert: since it normalises,
  // month 13 or second 75 pass. 1 January 1970 is valid at any time of day. `microSeconds` is not examined.
  void Set(unsigned short year, unsigned short month, unsigned int day, unsigned short hour, unsigned short minute,
           unsigned short second, unsigned int microSeconds, short utcOffset);

  void SetPrecision(bool precision);  // stored and handed back; changes neither text nor comparison
  void Clear();                       // makes this NULL

  // ---- Fields. Those of a NULL datetime mean nothing. ----

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
  boost::shared_ptr<TCIMDateTimeImpl> GetBody() const;  // still owned by this datetime, which changes with it

  // ---- Text ----

  std::string ToString() const;  // the 25-character CIM text; a field wider than its place prints whole

  // For people: "03/15/2007 14:30:00" (no microseconds, no offset), or "2 days 1 hour 5 milliseconds " for an interval,
  // with its trailing blank. A zero interval gives an empty text.
  std::string ToUIString() const;

  // ---- Comparison. Timestamps compare by the instant they denote, then by microseconds; intervals by their length.
  //      Throws kZEPStatusInvalidDateTime for a NULL, or for one timestamp and one interval. ----

  bool operator==(TCIMDateTime const& other) const;
  bool operator<(TCIMDateTime const& other) const;

  // ---- Arithmetic. Both operands stay as they are. Throws kZEPStatusInvalidDateTime for a NULL, and where the C library
  //      cannot convert. Results before 1970 or beyond the platform's limit follow localtime. ----

  // Interval + interval; timestamp + interval in either order, with the timestamp's UTC offset. Two timestamps throw.
  TCIMDateTime operator+(TCIMDateTime const& other) const;

  // Two timestamps, or two intervals: the absolute difference, as an interval. Timestamp - interval, and also
  // interval - timestamp: a timestamp with the timestamp's UTC offset.
  TCIMDateTime operator-(TCIMDateTime const& other) const;

  static TCIMDateTime GetDifference(TCIMDateTime& a, TCIMDateTime& b);  // always throws kZEPStatusNotImplemented

private:
  boost::shared_ptr<TCIMDateTimeImpl> fBody;  // never null, never shared between two datetimes
};

}  // namespace NQRVZEP20
