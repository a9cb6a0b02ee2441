// SPDX-License-Identifier: Apache-2.0

// Compares loading the core library with loading an empty one. Each load runs in a fresh process, which itself measures its
// call of dlopen.

#include <benchmark/benchmark.h>
#include <stdio.h>

#include <algorithm>
#include <array>
#include <string>

namespace {

// The time in seconds; negative when loading failed.
double TimeToLoad(char const* library) {
  FILE* const program = ::popen((std::string(ZEP_LOAD_PROGRAM) + " " + library).c_str(), "r");
  if (program == nullptr) return -1;
  double nanoseconds = -1e9;
  bool const isTold = std::fscanf(program, "%lf", &nanoseconds) == 1;
  return ::pclose(program) == 0 && isTold ? nanoseconds / 1e9 : -1;
}

// Each measurement is the median of several loads, so that an interrupted process does not count.
double MedianTimeToLoad(char const* library) {
  std::array<double, 21> seconds;
  for (double& one : seconds) one = TimeToLoad(library);
  std::sort(seconds.begin(), seconds.end());
  return seconds.front() < 0 ? -1 : seconds[seconds.size() / 2];
}

void Load(benchmark::State& state, char const* library) {
  for (auto _ : state) {
    double const seconds = MedianTimeToLoad(library);
    if (seconds < 0) return state.SkipWithError("the library cannot be loaded");
    state.SetIterationTime(seconds);
  }
}

void Load_Zep(benchmark::State& state) { Load(state, ZEP_LIBRARY); }
BENCHMARK(Load_Zep)->UseManualTime()->Iterations(20)->Unit(benchmark::kMicrosecond);

void Load_Empty(benchmark::State& state) { Load(state, ZEP_EMPTY_LIBRARY); }
BENCHMARK(Load_Empty)->UseManualTime()->Iterations(20)->Unit(benchmark::kMicrosecond);

}  // namespace
