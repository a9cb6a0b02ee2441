// SPDX-License-Identifier: Apache-2.0

// Compares plug-ins in processes of their own with plug-ins in the process of the front end: the host provider with the bundled
// sample, and a provider of 100,000 instances. Each load runs in a fresh process, which measures itself. Report is a whole run of
// zep report with the host provider, from the start of the program to its end.

#include <benchmark/benchmark.h>
#include <fcntl.h>
#include <spawn.h>
#include <stdio.h>
#include <stdlib.h>
#include <sys/wait.h>
#include <unistd.h>

#include <algorithm>
#include <array>
#include <chrono>
#include <string>

namespace {

struct TLoad {
  double fSeconds = -1;  // negative when loading failed
  long fKibibytes = 0;   // the peak of the memory of the front end
};

TLoad Load(std::string const& directory, std::string const& way) {
  std::string const command = "LD_LIBRARY_PATH=" + directory +
                              " ZEP_SMBIOS_TABLE=" ZEP_SOURCE_DIR "/tools/zep/sample/smbios.bin " ZEP_LOADS_PLUG_INS " " + way;
  FILE* const program = ::popen(command.c_str(), "r");
  if (program == nullptr) return {};
  TLoad load;
  std::size_t values = 0;
  bool const isRead = std::fscanf(program, "%lf %ld %zu", &load.fSeconds, &load.fKibibytes, &values) == 3;
  return ::pclose(program) == 0 && isRead && values > 0 ? load : TLoad();
}

TLoad MedianLoad(std::string const& directory, std::string const& way, std::size_t count) {
  std::array<TLoad, 21> loads;
  for (std::size_t n = 0; n < count; ++n) loads[n] = Load(directory, way);
  auto const end = loads.begin() + static_cast<std::ptrdiff_t>(count);
  std::sort(loads.begin(), end, [](TLoad const& one, TLoad const& other) { return one.fSeconds < other.fSeconds; });
  return loads.front().fSeconds < 0 ? TLoad() : loads[count / 2];
}

void Time(benchmark::State& state, char const* directory, char const* way, std::size_t count) {
  for (auto _ : state) {
    double const seconds = MedianLoad(directory, way, count).fSeconds;
    if (seconds < 0) return state.SkipWithError("the plug-ins cannot be loaded");
    state.SetIterationTime(seconds);
  }
}

// The seconds of a run of zep report; negative when it fails. `option` may be null.
double SecondsOfReport(char const* option) {
  ::setenv("LD_LIBRARY_PATH", ZEP_HOST_PLUG_IN, 1);
  std::array<char const*, 5> const arguments = {ZEP_PROGRAM, "report", "--sample", option, nullptr};
  posix_spawn_file_actions_t actions;
  ::posix_spawn_file_actions_init(&actions);
  ::posix_spawn_file_actions_addopen(&actions, STDOUT_FILENO, "/dev/null", O_WRONLY, 0);
  auto const start = std::chrono::steady_clock::now();
  pid_t program = -1;
  int const error = ::posix_spawn(&program, ZEP_PROGRAM, &actions, nullptr, const_cast<char**>(arguments.data()), environ);
  int status = 0;
  bool const hasRun = error == 0 && ::waitpid(program, &status, 0) == program && status == 0;
  double const seconds = std::chrono::duration<double>(std::chrono::steady_clock::now() - start).count();
  ::posix_spawn_file_actions_destroy(&actions);
  return hasRun ? seconds : -1;
}

void TimeOfReport(benchmark::State& state, char const* option) {
  for (auto _ : state) {
    std::array<double, 11> seconds;
    std::generate(seconds.begin(), seconds.end(), [option] { return SecondsOfReport(option); });
    std::sort(seconds.begin(), seconds.end());
    if (seconds.front() < 0) return state.SkipWithError("zep report fails");
    state.SetIterationTime(seconds[seconds.size() / 2]);
  }
}

// Reports a mebibyte as a millisecond.
void Memory(benchmark::State& state, char const* way) {
  for (auto _ : state) {
    TLoad const load = Load(ZEP_MANY_PLUG_IN, way);
    if (load.fSeconds < 0) return state.SkipWithError("the plug-ins cannot be loaded");
    state.SetIterationTime(static_cast<double>(load.fKibibytes) / 1024 / 1000);
  }
}

void Host_Apart(benchmark::State& state) { Time(state, ZEP_HOST_PLUG_IN, "apart", 11); }
BENCHMARK(Host_Apart)->UseManualTime()->Iterations(3)->Unit(benchmark::kMicrosecond);

void Host_InProcess(benchmark::State& state) { Time(state, ZEP_HOST_PLUG_IN, "here", 11); }
BENCHMARK(Host_InProcess)->UseManualTime()->Iterations(3)->Unit(benchmark::kMicrosecond);

void Report_Apart(benchmark::State& state) { TimeOfReport(state, nullptr); }
BENCHMARK(Report_Apart)->UseManualTime()->Iterations(3)->Unit(benchmark::kMicrosecond);

void Report_InProcess(benchmark::State& state) { TimeOfReport(state, "--in-process"); }
BENCHMARK(Report_InProcess)->UseManualTime()->Iterations(3)->Unit(benchmark::kMicrosecond);

void Thirty_Milliseconds(benchmark::State& state) {
  for (auto _ : state) state.SetIterationTime(0.030);
}
BENCHMARK(Thirty_Milliseconds)->UseManualTime()->Iterations(3)->Unit(benchmark::kMicrosecond);

void Many_Apart(benchmark::State& state) { Time(state, ZEP_MANY_PLUG_IN, "apart", 1); }
BENCHMARK(Many_Apart)->UseManualTime()->Iterations(1)->Unit(benchmark::kMicrosecond);

void Many_InProcess(benchmark::State& state) { Time(state, ZEP_MANY_PLUG_IN, "here", 1); }
BENCHMARK(Many_InProcess)->UseManualTime()->Iterations(1)->Unit(benchmark::kMicrosecond);

void Memory_Apart(benchmark::State& state) { Memory(state, "apart"); }
BENCHMARK(Memory_Apart)->UseManualTime()->Iterations(1)->Unit(benchmark::kMicrosecond);

void Memory_InProcess(benchmark::State& state) { Memory(state, "here"); }
BENCHMARK(Memory_InProcess)->UseManualTime()->Iterations(1)->Unit(benchmark::kMicrosecond);

}  // namespace
