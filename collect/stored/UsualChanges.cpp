// SPDX-License-Identifier: Apache-2.0
#include "collect/stored/UsualChanges.h"

#include <algorithm>
#include <cmath>
#include <cstdlib>
#include <ctime>
#include <iterator>
#include <optional>
#include <string_view>

namespace NQRVZEP20 {

namespace {

bool Contains(std::string_view text, std::string_view part) { return text.find(part) != text.npos; }

// Properties that change on a machine with which nothing has happened; those in the first column of any class.
struct TVolatile {
  std::string_view fClass, fProperty;
};
constexpr TVolatile kVolatile[] = {{"", "Age"},
                                   {"", "AvailableMemory"},
                                   {"", "AvailableSpace"},
                                   {"", "ClockTime"},
                                   {"", "CurrentClockSpeed"},
                                   {"", "FreeInodes"},
                                   {"", "FreeMemory"},
                                   {"", "FreePhysicalMemory"},
                                   {"", "FreeSpace"},
                                   {"", "FreeSpaceInPagingFiles"},
                                   {"", "FreeSwap"},
                                   {"", "FreeVirtualMemory"},
                                   {"", "LoadOfFifteenMinutes"},
                                   {"", "LoadOfFiveMinutes"},
                                   {"", "LoadOfOneMinute"},
                                   {"", "LoadPercentage"},
                                   {"", "LocalDateTime"},
                                   {"", "NumberOfFiles"},
                                   {"", "NumberOfProcesses"},
                                   {"", "NumberOfUsers"},
                                   {"", "PowerOnHours"},
                                   {"", "PreferredLifetime"},
                                   {"", "TotalPowerOnHours"},
                                   {"", "Uptime"},
                                   {"", "ValidLifetime"},
                                   {"ZEP_DiskHealth", "BytesRead"},
                                   {"ZEP_DiskHealth", "BytesWritten"},
                                   {"ZEP_KernelLog", "CurrentNumberOfRecords"},
                                   {"ZEP_KernelLog", "GoneRecords"},
                                   {"ZEP_KernelLogRecord", "MessageTimestamp"},
                                   {"ZEP_RaidArray", "Progress"},
                                   {"ZEP_SmartAttribute", "RawText"},
                                   {"ZEP_SmartAttribute", "RawValue"},
                                   {"ZEP_SwapArea", "Used"}};

bool IsVolatile(std::string const& cls, std::string const& property) {
  bool const isTraffic = Contains(cls, "Statistics") && !Contains(property, "Error") && !Contains(property, "Failure");
  return isTraffic || std::any_of(std::begin(kVolatile), std::end(kVolatile), [&](TVolatile const& row) {
           return row.fProperty == property && (row.fClass.empty() || row.fClass == cls);
         });
}

bool IsReading(std::string const& cls, std::string const& property) {
  return property == "CurrentReading" || (cls == "ZEP_DiskHealth" && property == "Temperature") ||
         (cls == "ZEP_SmartAttribute" && property == "Value");
}

// The time of a datetime; nothing if it has none, and if it is an interval.
std::optional<std::time_t> TimeIn(TStoredProperty const& property) {
  std::tm utc{};
  char const* const end = ::strptime(property.fRaw.c_str(), "%Y%m%d%H%M%S", &utc);
  return end != nullptr && *end == '.' ? std::optional(::timegm(&utc)) : std::nullopt;
}

double NumberIn(TStoredProperty const* property) {
  return property != nullptr && property->IsKnown() ? std::strtod(property->fRaw.c_str(), nullptr) : 0;
}

// The kernel counts from its start, and corrections of the clock move that.
bool IsSameStart(TStoredInstance const& before, TStoredInstance const& after, std::string const& name) {
  constexpr double seconds = 10;
  if (name != "LastBootUpTime") return false;
  auto const one = TimeIn(*before.Find(name)), other = TimeIn(*after.Find(name));
  return one && other && std::abs(std::difftime(*one, *other)) <= seconds;
}

// Whether the reading of a sensor moved less than makes it another one, in either direction.
bool IsWithinHysteresis(TStoredInstance const& before, TStoredInstance const& after, std::string const& name) {
  constexpr double usual = 0.1;  // of the reading
  TStoredProperty const *const one = before.Find(name), *const other = after.Find(name);
  if (!IsReading(before.fClass, name) || !one->IsKnown() || !other->IsKnown()) return false;
  double const hysteresis = std::max(NumberIn(before.Find("Hysteresis")), NumberIn(after.Find("Hysteresis")));
  double const largest = std::max(std::abs(NumberIn(one)), std::abs(NumberIn(other)));
  return std::abs(NumberIn(one) - NumberIn(other)) <= (hysteresis > 0 ? hysteresis : usual * largest);
}

}  // namespace

bool IsUsualChange(TStoredInstance const& before, TStoredInstance const& after, std::string const& property) {
  return IsVolatile(before.fClass, property) || IsSameStart(before, after, property) ||
         IsWithinHysteresis(before, after, property);
}

std::string LastingPath(TStoredInstance const& instance) {
  if (instance.fClass != "ZEP_KernelLogRecord") return instance.fPath;
  std::string path = instance.fNamespace + ":" + instance.fClass;
  for (char const* const name : {"RecordID", "RecordData"}) {
    TStoredProperty const* const property = instance.Find(name);
    path += property == nullptr ? "" : "," + property->fRaw;
  }
  return path;
}

}  // namespace NQRVZEP20
