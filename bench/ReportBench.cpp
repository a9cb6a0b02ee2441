// SPDX-License-Identifier: Apache-2.0

// Compares the whole report on this machine, with all provider plug-ins beside libzepcore.so, with the description that lshw
// makes, and the comparison of two stored reports with that by the json module of Python. Each run is a fresh process, whose
// output is read through a pipe.

#include <benchmark/benchmark.h>
#include <stdio.h>
#include <unistd.h>

#include <algorithm>
#include <array>
#include <chrono>
#include <string>

namespace {

// The time in seconds until the output ends; negative when it is empty.
double Run(std::string const& command) {
  auto const start = std::chrono::steady_clock::now();
  FILE* const program = ::popen((command + " 2>/dev/null").c_str(), "r");
  if (program == nullptr) return -1;
  char chunk[65536];
  std::size_t size = 0;
  for (std::size_t got; (got = std::fread(chunk, 1, sizeof chunk, program)) > 0;) size += got;
  ::pclose(program);
  return size == 0 ? -1 : std::chrono::duration<double>(std::chrono::steady_clock::now() - start).count();
}

void Time(benchmark::State& state, std::string const& program, std::string const& arguments) {
  if (::access(program.c_str(), X_OK) != 0) return state.SkipWithError((program + " is not installed").c_str());
  for (auto _ : state) {
    std::array<double, 5> seconds;
    for (double& one : seconds) one = Run("exec " + program + " " + arguments);
    std::sort(seconds.begin(), seconds.end());
    if (seconds.front() < 0) return state.SkipWithError("there is no output");
    state.SetIterationTime(seconds[seconds.size() / 2]);
  }
}

void Text_Zep(benchmark::State& state) { Time(state, ZEP_PROGRAM, "report"); }
BENCHMARK(Text_Zep)->UseManualTime()->Iterations(3)->Unit(benchmark::kMicrosecond);

void Json_Zep(benchmark::State& state) { Time(state, ZEP_PROGRAM, "report --json"); }
BENCHMARK(Json_Zep)->UseManualTime()->Iterations(3)->Unit(benchmark::kMicrosecond);

void Json_lshw(benchmark::State& state) { Time(state, "/usr/bin/lshw", "-json"); }
BENCHMARK(Json_lshw)->UseManualTime()->Iterations(3)->Unit(benchmark::kMicrosecond);

// Two reports on this machine, while it exists.
class TTwoReports {
public:
  TTwoReports() {
    for (char const* const file : {kBefore, kAfter}) Run(std::string(ZEP_PROGRAM) + " report --json | tee " + file);
  }
  ~TTwoReports() {
    for (char const* const file : {kBefore, kAfter}) std::remove(file);
  }

  static constexpr char const *kBefore = "ReportBench-before.json", *kAfter = "ReportBench-after.json";
};

void Diff_Zep(benchmark::State& state) {
  TTwoReports const reports;
  Time(state, ZEP_PROGRAM, std::string("diff ") + reports.kBefore + " " + reports.kAfter);
}
BENCHMARK(Diff_Zep)->UseManualTime()->Iterations(3)->Unit(benchmark::kMicrosecond);

// Reads both, and compares their objects as a whole.
void Diff_Python(benchmark::State& state) {
  TTwoReports const reports;
  std::string const load = "json.load(open(\"", instances = "\"))[\"instances\"]";
  Time(state, "/usr/bin/python3",
       "-c 'import json; print(" + load + reports.kBefore + instances + " == " + load + reports.kAfter + instances + ")'");
}
BENCHMARK(Diff_Python)->UseManualTime()->Iterations(3)->Unit(benchmark::kMicrosecond);

}  // namespace
