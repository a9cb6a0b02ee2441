// SPDX-License-Identifier: Apache-2.0

// Compares reading a configuration file of 100,000 lines with GLib's GKeyFile, for sorted and for shuffled keys, and
// looking keys up.

#include "TConfig.h"

#include <benchmark/benchmark.h>
#include <glib.h>
#include <stdlib.h>

#include <algorithm>
#include <filesystem>
#include <fstream>
#include <numeric>
#include <random>
#include <stdexcept>
#include <string>
#include <vector>

namespace {

using NQRVZEP20::TConfig;

constexpr std::size_t kLines = 100000;

// Works in a directory that holds the same settings twice: in "zep.cfg", and with a group in "zep.ini" for GKeyFile.
class TSettingsDirectory {
public:
  explicit TSettingsDirectory(bool inOrder) : fOld(std::filesystem::current_path()) {
    if (::mkdtemp(fPath) == nullptr) throw std::runtime_error("no temporary directory");
    std::filesystem::current_path(fPath);
    std::vector<int> numbers(kLines);
    std::iota(numbers.begin(), numbers.end(), 100000);
    if (!inOrder) std::shuffle(numbers.begin(), numbers.end(), std::mt19937(1983));
    std::ofstream ours("zep.cfg"), theirs("zep.ini");
    theirs << "[group]\n";
    for (int const number : numbers)
      for (std::ofstream* const file : {&ours, &theirs})
        *file << "collector.setting." << number << "=value of setting " << number << "\n";
  }
  ~TSettingsDirectory() {
    std::filesystem::current_path(fOld);
    std::filesystem::remove_all(fPath);
  }

private:
  std::filesystem::path fOld;
  char fPath[32] = "/tmp/zep-config-bench.XXXXXX";
};

void ReadByZep(benchmark::State& state, bool inOrder) {
  TSettingsDirectory const directory(inOrder);
  for (auto _ : state) {
    TConfig config;
    if (config.getValue("collector.setting.123456").empty()) throw std::runtime_error("settings lost");
  }
}
BENCHMARK_CAPTURE(ReadByZep, InOrder, true)->Name("SettingsInOrder_Zep");
BENCHMARK_CAPTURE(ReadByZep, InAnyOrder, false)->Name("SettingsInAnyOrder_Zep");

void ReadByGKeyFile(benchmark::State& state, bool inOrder) {
  TSettingsDirectory const directory(inOrder);
  for (auto _ : state) {
    GKeyFile* const file = g_key_file_new();
    g_key_file_load_from_file(file, "zep.ini", G_KEY_FILE_NONE, nullptr);
    char* const value = g_key_file_get_value(file, "group", "collector.setting.123456", nullptr);
    if (value == nullptr) throw std::runtime_error("settings lost");
    g_free(value);
    g_key_file_free(file);
  }
}
BENCHMARK_CAPTURE(ReadByGKeyFile, InOrder, true)->Name("SettingsInOrder_GKeyFile");
BENCHMARK_CAPTURE(ReadByGKeyFile, InAnyOrder, false)->Name("SettingsInAnyOrder_GKeyFile");

// Looks up all keys, in any order.
std::vector<std::string> Keys() {
  std::vector<std::string> keys;
  for (std::size_t i = 0; i < kLines; ++i) keys.push_back("collector.setting." + std::to_string(100000 + i));
  std::shuffle(keys.begin(), keys.end(), std::mt19937(2007));
  return keys;
}

void LookUp_Zep(benchmark::State& state) {
  TSettingsDirectory const directory(true);
  TConfig config;
  std::vector<std::string> const keys = Keys();
  for (auto _ : state)
    for (std::string const& key : keys) benchmark::DoNotOptimize(config.getValue(key));
}
BENCHMARK(LookUp_Zep);

void LookUp_GKeyFile(benchmark::State& state) {
  TSettingsDirectory const directory(true);
  GKeyFile* const file = g_key_file_new();
  g_key_file_load_from_file(file, "zep.ini", G_KEY_FILE_NONE, nullptr);
  std::vector<std::string> const keys = Keys();
  for (auto _ : state)
    for (std::string const& key : keys) g_free(g_key_file_get_value(file, "group", key.c_str(), nullptr));
  g_key_file_free(file);
}
BENCHMARK(LookUp_GKeyFile);

}  // namespace
