// SPDX-License-Identifier: Apache-2.0

// Compares reading the identity of a machine (type, name, model and serial number) from the bundled sample, an SMBIOS table
// of 7 KB, with what a script would do: run dmidecode for the serial number alone.

#include "TOSSpecific.h"

#include <benchmark/benchmark.h>
#include <fcntl.h>
#include <spawn.h>
#include <stdlib.h>
#include <sys/wait.h>
#include <unistd.h>

#include <string>

namespace {

using NQRVZEP20::TOSSpecific;

constexpr char const* kSample = ZEP_SOURCE_DIR "/tools/zep/sample/smbios.bin";

void Identity_Zep(benchmark::State& state) {
  ::setenv("ZEP_SMBIOS_TABLE", kSample, 1);
  if (TOSSpecific::GetMachineSN() != "KQ12345") return state.SkipWithError("the sample was not read");
  for (auto _ : state)
    for (char const* key : {"type", "name", "model", "SN"}) {
      std::string field = TOSSpecific::GetMachineInfo(key);
      benchmark::DoNotOptimize(field);
    }
}
BENCHMARK(Identity_Zep);

// The program's output, read through a pipe; empty when the program cannot be run.
std::string SerialNumberOfDmidecode() {
  int pipe[2];
  if (::pipe2(pipe, O_CLOEXEC) != 0) return "";
  posix_spawn_file_actions_t actions;
  posix_spawn_file_actions_init(&actions);
  posix_spawn_file_actions_adddup2(&actions, pipe[1], STDOUT_FILENO);
  char const* arguments[] = {"dmidecode", "--from-dump", kSample, "-s", "system-serial-number", nullptr};
  pid_t child = -1;
  int const error = ::posix_spawn(&child, ZEP_DMIDECODE, &actions, nullptr, const_cast<char**>(arguments), environ);
  posix_spawn_file_actions_destroy(&actions);
  ::close(pipe[1]);

  std::string output;
  char chunk[256];
  for (ssize_t got; (got = ::read(pipe[0], chunk, sizeof chunk)) > 0;) output.append(chunk, static_cast<std::size_t>(got));
  ::close(pipe[0]);
  if (error == 0) ::waitpid(child, nullptr, 0);
  return output;
}

void SerialNumber_dmidecode(benchmark::State& state) {
  if (SerialNumberOfDmidecode() != "KQ12345\n") return state.SkipWithError("dmidecode did not read the sample");
  for (auto _ : state) {
    std::string output = SerialNumberOfDmidecode();
    benchmark::DoNotOptimize(output);
  }
}
BENCHMARK(SerialNumber_dmidecode)->UseRealTime();

}  // namespace
