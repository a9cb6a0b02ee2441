// SPDX-License-Identifier: Apache-2.0

// Compares log entries with spdlog's: one that the threshold drops, and one that is written to a file and flushed. Both
// loggers are reached as callers reach them, through the accessor function. Entries that are only kept are compared with a list.

#include "TLogger.h"
#include "TRootObject.h"

#include <benchmark/benchmark.h>
#include <spdlog/sinks/basic_file_sink.h>
#include <spdlog/spdlog.h>
#include <stdlib.h>
#include <time.h>

#include <ctime>
#include <filesystem>
#include <list>
#include <stdexcept>
#include <string>

namespace {

using NQRVZEP20::ILogger;
using NQRVZEP20::TLogger;
using NQRVZEP20::TRootObject;

std::string const kMessage = "TConfig::getValue(): key found, value is /var/log/messages";

class TLogDirectory {
public:
  TLogDirectory() {
    if (::mkdtemp(fPath) == nullptr) throw std::runtime_error("no temporary directory");
  }
  ~TLogDirectory() { std::filesystem::remove_all(fPath); }
  std::string Path(char const* name) const { return std::string(fPath) + "/" + name; }

private:
  char fPath[32] = "/tmp/zep-log-bench.XXXXXX";
};

// Both loggers have an open file and write entries of severity Status (info) and more severe ones.
class TLoggers {
public:
  TLoggers() {
    TLogger::GetInstance()->SetLogFilename(fDirectory.Path("zep.log"));
    spdlog::set_default_logger(spdlog::basic_logger_mt("zep", fDirectory.Path("spdlog.log"), true));
    spdlog::set_level(spdlog::level::info);
    spdlog::flush_on(spdlog::level::trace);
  }
  ~TLoggers() { spdlog::shutdown(); }

private:
  TLogDirectory fDirectory;
} const gLoggers;

void FilteredCall_Zep(benchmark::State& state) {
  for (auto _ : state) TRootObject::GetCoreLogger()->OutputLogEntry(ILogger::kLogDebug, kMessage);
}
BENCHMARK(FilteredCall_Zep);

void FilteredCall_spdlog(benchmark::State& state) {
  for (auto _ : state) spdlog::default_logger_raw()->debug(kMessage);
}
BENCHMARK(FilteredCall_spdlog);

// At Debug, so that nothing is added to the in-memory list, which spdlog does not have.
void FlushedLine_Zep(benchmark::State& state) {
  TLogger::SetLogThreshold(ILogger::kLogDebug);
  for (auto _ : state) TRootObject::GetCoreLogger()->OutputLogEntry(ILogger::kLogDebug, kMessage);
  TLogger::SetLogThreshold(ILogger::kLogStatus);
}
BENCHMARK(FlushedLine_Zep);

void FlushedLine_spdlog(benchmark::State& state) {
  spdlog::set_level(spdlog::level::debug);
  for (auto _ : state) spdlog::default_logger_raw()->debug(kMessage);
  spdlog::set_level(spdlog::level::info);
}
BENCHMARK(FlushedLine_spdlog);

// Entries that are only kept in the list.
constexpr int kEntries = 1000;

void KeptEntries_Zep(benchmark::State& state) {
  for (auto _ : state) {
    for (int i = 0; i < kEntries; ++i) TRootObject::GetCoreLogger()->OutputLogEntry(ILogger::kLogMemoryOnly, kMessage);
    TLogger::GetInstance()->ClearLog();
  }
}
BENCHMARK(KeptEntries_Zep);

// The same list, filled by hand.
void KeptEntries_List(benchmark::State& state) {
  struct TEntry {
    int fSeverity;
    std::string fMessage;
    std::tm fTime;
    unsigned int fMicroSeconds;
  };
  std::list<TEntry> entries;
  for (auto _ : state) {
    for (int i = 0; i < kEntries; ++i) {
      timespec now;
      ::clock_gettime(CLOCK_REALTIME, &now);
      entries.push_back({ILogger::kLogMemoryOnly, kMessage, std::tm(), static_cast<unsigned int>(now.tv_nsec / 1000)});
      benchmark::DoNotOptimize(entries.back());
    }
    entries.clear();
  }
}
BENCHMARK(KeptEntries_List);

}  // namespace
