// SPDX-License-Identifier: Apache-2.0

// Compares child processes with those of GLib, Boost.Process and popen: running one that prints nothing, also from a parent
// that holds much memory, and capturing 10 MB of output.

#include "TOSSpecific.h"

#include <benchmark/benchmark.h>
#include <glib.h>
#include <stdlib.h>

#include <boost/process.hpp>
#include <cstdio>
#include <filesystem>
#include <fstream>
#include <memory>
#include <stdexcept>
#include <string>
#include <vector>

namespace {

using NQRVZEP20::TOSSpecific;

std::string ReadAll(std::FILE* file) {
  std::string text;
  char chunk[4096];
  while (std::size_t const got = std::fread(chunk, 1, sizeof chunk, file)) text.append(chunk, got);
  return text;
}

std::string CaptureByZep(std::string const& program, std::vector<std::string> const& arguments) {
  std::string output;
  if (TOSSpecific::SpawnProcess(program, arguments, output, -1) != 0) throw std::runtime_error("the child failed");
  return output;
}

// Leaves descriptors open for the child, as the others do; GLib then uses its fastest way to start it.
std::string CaptureByGSpawn(std::string const& program, std::vector<std::string> const& arguments) {
  std::vector<char*> texts{const_cast<char*>(program.c_str())};
  for (std::string const& argument : arguments) texts.push_back(const_cast<char*>(argument.c_str()));
  texts.push_back(nullptr);
  char* output = nullptr;
  int status = 0;
  if (!g_spawn_sync(nullptr, texts.data(), nullptr, G_SPAWN_LEAVE_DESCRIPTORS_OPEN, nullptr, nullptr, &output, nullptr, &status,
                    nullptr) ||
      status != 0)
    throw std::runtime_error("the child failed");
  std::string text(output);
  g_free(output);
  return text;
}

std::string CaptureByBoost(std::string const& program, std::vector<std::string> const& arguments) {
  boost::process::ipstream stream;
  boost::process::child child(program, boost::process::args(arguments), boost::process::std_out > stream);
  std::string output(std::istreambuf_iterator<char>(stream), {});
  child.wait();
  if (child.exit_code() != 0) throw std::runtime_error("the child failed");
  return output;
}

std::string CaptureByPopen(std::string const& program, std::vector<std::string> const& arguments) {
  std::string command = program;
  for (std::string const& argument : arguments) command += " " + argument;
  std::FILE* const pipe = ::popen(command.c_str(), "r");
  if (pipe == nullptr) throw std::runtime_error("no child");
  std::string output = ReadAll(pipe);
  if (::pclose(pipe) != 0) throw std::runtime_error("the child failed");
  return output;
}

using TCapture = std::string (*)(std::string const&, std::vector<std::string> const&);

void Spawn(benchmark::State& state, TCapture capture) {
  for (auto _ : state) benchmark::DoNotOptimize(capture("/bin/true", {}));
}
BENCHMARK_CAPTURE(Spawn, Zep, CaptureByZep)->Name("Spawn_Zep")->UseRealTime();
BENCHMARK_CAPTURE(Spawn, GSpawn, CaptureByGSpawn)->Name("Spawn_GSpawn")->UseRealTime();
BENCHMARK_CAPTURE(Spawn, BoostProcess, CaptureByBoost)->Name("Spawn_BoostProcess")->UseRealTime();
BENCHMARK_CAPTURE(Spawn, Popen, CaptureByPopen)->Name("Spawn_Popen")->UseRealTime();

void CaptureTenMegabytes(benchmark::State& state, TCapture capture) {
  char directory[] = "/tmp/zep-process-bench.XXXXXX";
  if (::mkdtemp(directory) == nullptr) throw std::runtime_error("no temporary directory");
  std::string const file = std::string(directory) + "/text";
  constexpr std::size_t kSize = 10 * 1000 * 1000;
  std::ofstream(file) << std::string(kSize, 'x');
  for (auto _ : state)
    if (capture("/bin/cat", {file}).size() != kSize) throw std::runtime_error("output lost");
  state.SetBytesProcessed(static_cast<std::int64_t>(state.iterations() * kSize));
  std::filesystem::remove_all(directory);
}
BENCHMARK_CAPTURE(CaptureTenMegabytes, Zep, CaptureByZep)->Name("CaptureTenMegabytes_Zep")->UseRealTime();
BENCHMARK_CAPTURE(CaptureTenMegabytes, Popen, CaptureByPopen)->Name("CaptureTenMegabytes_Popen")->UseRealTime();

void SpawnFromALargeParent(benchmark::State& state, TCapture capture) {
  std::vector<char> const twoGibibytes(std::size_t{2} << 30, 'x');
  for (auto _ : state) benchmark::DoNotOptimize(capture("/bin/true", {}));
}
BENCHMARK_CAPTURE(SpawnFromALargeParent, Zep, CaptureByZep)->Name("SpawnFromALargeParent_Zep")->UseRealTime()->Iterations(20);
BENCHMARK_CAPTURE(SpawnFromALargeParent, GSpawn, CaptureByGSpawn)
    ->Name("SpawnFromALargeParent_GSpawn")
    ->UseRealTime()
    ->Iterations(20);
BENCHMARK_CAPTURE(SpawnFromALargeParent, BoostProcess, CaptureByBoost)
    ->Name("SpawnFromALargeParent_BoostProcess")
    ->UseRealTime()
    ->Iterations(20);
BENCHMARK_CAPTURE(SpawnFromALargeParent, Popen, CaptureByPopen)
    ->Name("SpawnFromALargeParent_Popen")
    ->UseRealTime()
    ->Iterations(20);

}  // namespace
