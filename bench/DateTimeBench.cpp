// SPDX-License-Identifier: Apache-2.0

// Compares datetimes with their peers: reading text and comparing with GLib's GDateTime, printing with snprintf. Each round uses
// the same points in time, in winter and in summer.

#include "TCIMDateTime.h"
#include "TOSSpecific.h"

#include <benchmark/benchmark.h>
#include <glib.h>
#include <time.h>

#include <cstdio>
#include <ctime>
#include <string>
#include <vector>

namespace {

using NQRVZEP20::TCIMDateTime;
using NQRVZEP20::TOSSpecific;

std::vector<std::string> const kCIMTexts = {"20070315143000.000000+060", "20240229235959.999999-300", "19991231000000.000001+000",
                                            "20300704120507.250000+330"};
std::vector<std::string> const kISOTexts = {"2007-03-15T14:30:00.000000+01:00", "2024-02-29T23:59:59.999999-05:00",
                                            "1999-12-31T00:00:00.000001+00:00", "2030-07-04T12:05:07.250000+05:30"};

void Parse_Zep(benchmark::State& state) {
  for (auto _ : state)
    for (std::string const& text : kCIMTexts) {
      TCIMDateTime dateTime(text);
      benchmark::DoNotOptimize(dateTime);
    }
}
BENCHMARK(Parse_Zep);

void Parse_GDateTime(benchmark::State& state) {
  for (auto _ : state)
    for (std::string const& text : kISOTexts) {
      GDateTime* const dateTime = g_date_time_new_from_iso8601(text.c_str(), nullptr);
      benchmark::DoNotOptimize(dateTime);
      g_date_time_unref(dateTime);
    }
}
BENCHMARK(Parse_GDateTime);

std::vector<TCIMDateTime> DateTimes() { return {kCIMTexts.begin(), kCIMTexts.end()}; }

void Print_Zep(benchmark::State& state) {
  std::vector<TCIMDateTime> const dateTimes = DateTimes();
  for (auto _ : state)
    for (TCIMDateTime const& dateTime : dateTimes) {
      std::string text = dateTime.ToString();
      benchmark::DoNotOptimize(text);
    }
}
BENCHMARK(Print_Zep);

void Print_snprintf(benchmark::State& state) {
  std::vector<TCIMDateTime> const dateTimes = DateTimes();
  for (auto _ : state)
    for (TCIMDateTime const& dateTime : dateTimes) {
      int const offset = dateTime.GetUTCOffset();
      char buffer[64];
      std::snprintf(buffer, sizeof buffer, "%04d%02d%02d%02d%02d%02d.%06u%c%03d", dateTime.GetYear(), dateTime.GetMonth(),
                    static_cast<int>(dateTime.GetDay()), dateTime.GetHour(), dateTime.GetMinute(), dateTime.GetSecond(),
                    dateTime.GetMicroSeconds(), offset < 0 ? '-' : '+', offset < 0 ? -offset : offset);
      std::string text(buffer);
      benchmark::DoNotOptimize(text);
    }
}
BENCHMARK(Print_snprintf);

void Compare_Zep(benchmark::State& state) {
  std::vector<TCIMDateTime> const dateTimes = DateTimes();
  for (auto _ : state)
    for (TCIMDateTime const& left : dateTimes)
      for (TCIMDateTime const& right : dateTimes) benchmark::DoNotOptimize(left < right);
}
BENCHMARK(Compare_Zep);

void Compare_GDateTime(benchmark::State& state) {
  std::vector<GDateTime*> dateTimes;
  for (std::string const& text : kISOTexts) dateTimes.push_back(g_date_time_new_from_iso8601(text.c_str(), nullptr));
  for (auto _ : state)
    for (GDateTime* const left : dateTimes)
      for (GDateTime* const right : dateTimes) benchmark::DoNotOptimize(g_date_time_compare(left, right));
  for (GDateTime* const dateTime : dateTimes) g_date_time_unref(dateTime);
}
BENCHMARK(Compare_GDateTime);

// The logger reads the time several times for each line.
void LocalTime_Zep(benchmark::State& state) {
  for (auto _ : state) {
    TCIMDateTime now = TOSSpecific::GetLocalTime();
    benchmark::DoNotOptimize(now);
  }
}
BENCHMARK(LocalTime_Zep);

// Fields without an object that holds them.
void LocalTime_localtime_r(benchmark::State& state) {
  for (auto _ : state) {
    timespec now;
    ::clock_gettime(CLOCK_REALTIME, &now);
    std::tm fields;
    ::localtime_r(&now.tv_sec, &fields);
    benchmark::DoNotOptimize(fields);
  }
}
BENCHMARK(LocalTime_localtime_r);

}  // namespace
