// SPDX-License-Identifier: Apache-2.0

// Operations on many elements, lines, classes or instances, each with 1, 10 and 100 times as many. scripts/bench prints how
// the time grows: the exponent is 1 where 100 times as many take 100 times as long.

#include "ICIMClass.h"
#include "ICIMInstance.h"
#include "ILogger.h"
#include "TCIMCopy.h"
#include "TCIMReference.h"
#include "TConfig.h"
#include "TLogger.h"
#include "TRootObject.h"
#include "providers/memory/TMemoryNamespace.h"

#include <benchmark/benchmark.h>
#include <stdlib.h>
#include <boost/make_shared.hpp>

#include <filesystem>
#include <fstream>
#include <numeric>
#include <stdexcept>
#include <string>
#include <vector>

namespace {

using namespace NQRVZEP20;

using TNamespacePointer = boost::shared_ptr<TMemoryNamespace>;

std::size_t SizeOf(benchmark::State const& state) { return static_cast<std::size_t>(state.range(0)); }

// ---- Elements of an array ----

TCIMValue ArrayOfNumbers(std::size_t count) {
  std::vector<unsigned int> numbers(count);
  std::iota(numbers.begin(), numbers.end(), 1000000u);
  return TCIMValue(TCIMValue::TCIMType::kCIMTypeUint32, 0, std::vector<TCIMValue>(numbers.begin(), numbers.end()));
}

void ArrayCopy_Growth(benchmark::State& state) {
  TCIMValue const array = ArrayOfNumbers(SizeOf(state));
  for (auto _ : state) {
    TCIMValue copy(array);
    benchmark::DoNotOptimize(copy);
  }
}
BENCHMARK(ArrayCopy_Growth)->RangeMultiplier(10)->Range(100, 10000);

void ArrayText_Growth(benchmark::State& state) {
  TCIMValue const array = ArrayOfNumbers(SizeOf(state));
  for (auto _ : state) benchmark::DoNotOptimize(array.ToString());
}
BENCHMARK(ArrayText_Growth)->RangeMultiplier(10)->Range(100, 10000);

// ---- Keys of an object path ----

std::string NumberedKey(std::size_t number) { return "Key" + std::to_string(1000 + number); }

void PathOfKeys_Growth(benchmark::State& state) {
  auto const ns = boost::make_shared<TMemoryNamespace>("root/bench");
  TMemoryClassBuilder builder = ns->DefineClass("X_Keys");
  std::string path = "root/bench:X_Keys";
  for (std::size_t i = 0; i < SizeOf(state); ++i) {
    builder.Key(NumberedKey(i), "string");
    path += (i == 0 ? "." : ",") + NumberedKey(i) + "=\"value\"";
  }
  for (auto _ : state) {
    TCIMReference const reference(ns, path, TCIMContext());
    benchmark::DoNotOptimize(reference.GetPath());
  }
}
BENCHMARK(PathOfKeys_Growth)->RangeMultiplier(10)->Range(10, 1000);

// ---- Classes ----

TNamespacePointer NamespaceOfClasses(std::size_t count) {
  auto const ns = boost::make_shared<TMemoryNamespace>("root/bench");
  for (std::size_t i = 0; i < count; ++i)
    ns->DefineClass("X_Class" + std::to_string(i))
        .Key("DeviceID", "string")
        .Property("Slot", "uint32")
        .Property("Model", "string");
  return ns;
}

void DefineClasses_Growth(benchmark::State& state) {
  for (auto _ : state) NamespaceOfClasses(SizeOf(state));
}
BENCHMARK(DefineClasses_Growth)->RangeMultiplier(10)->Range(100, 10000)->Unit(benchmark::kMicrosecond);

void CopyClasses_Growth(benchmark::State& state) {
  TNamespacePointer const source = NamespaceOfClasses(SizeOf(state));
  for (auto _ : state) TCIMCopy::CopyClasses(source, boost::make_shared<TMemoryNamespace>("root/copy"), true);
}
BENCHMARK(CopyClasses_Growth)->RangeMultiplier(10)->Range(100, 10000)->Unit(benchmark::kMicrosecond);

// ---- Instances ----

TNamespacePointer NamespaceOfInstances(std::size_t count) {
  TNamespacePointer const ns = NamespaceOfClasses(1);
  for (std::size_t i = 0; i < count; ++i)
    ns->AddInstance("X_Class0", {{"DeviceID", "/dev/disk" + std::to_string(i)}, {"Slot", 7u}, {"Model", "Model of a disk"}});
  return ns;
}

void AddInstances_Growth(benchmark::State& state) {
  for (auto _ : state) NamespaceOfInstances(SizeOf(state));
}
BENCHMARK(AddInstances_Growth)->RangeMultiplier(10)->Range(1000, 100000)->Unit(benchmark::kMicrosecond);

// Each path is looked up once.
void FindInstances_Growth(benchmark::State& state) {
  TNamespacePointer const ns = NamespaceOfInstances(SizeOf(state));
  std::vector<TCIMReference> paths;
  ns->GetClass("X_Class0", TCIMContext())
      ->EnumerateInstances(
          [&](boost::shared_ptr<ICIMInstance> instance) {
            paths.push_back(instance->GetPath(TCIMContext()));
            return true;
          },
          TCIMContext());
  for (auto _ : state)
    for (TCIMReference const& path : paths) benchmark::DoNotOptimize(ns->GetInstance(path, TCIMContext()));
}
BENCHMARK(FindInstances_Growth)->RangeMultiplier(10)->Range(1000, 100000)->Unit(benchmark::kMicrosecond);

// ---- Log entries kept in memory ----

void KeptEntries_Growth(benchmark::State& state) {
  for (auto _ : state) {
    for (std::size_t i = 0; i < SizeOf(state); ++i)
      TRootObject::GetCoreLogger()->OutputLogEntry(ILogger::kLogMemoryOnly, "An entry of the log.");
    TLogger::GetInstance()->ClearLog();
  }
}
BENCHMARK(KeptEntries_Growth)->RangeMultiplier(10)->Range(100, 10000)->Unit(benchmark::kMicrosecond);

// ---- Lines of the configuration file ----

// The working directory while it exists. Its zep.cfg has as many lines.
class TDirectoryOfSettings {
public:
  explicit TDirectoryOfSettings(std::size_t lines) : fOld(std::filesystem::current_path()) {
    if (::mkdtemp(fPath) == nullptr) throw std::runtime_error("no temporary directory");
    std::filesystem::current_path(fPath);
    std::ofstream settings("zep.cfg");
    for (std::size_t i = 0; i < lines; ++i) settings << "collector.setting." << 1000000 + i << "=value of setting " << i << "\n";
  }
  ~TDirectoryOfSettings() {
    std::filesystem::current_path(fOld);
    std::filesystem::remove_all(fPath);
  }
  TDirectoryOfSettings(TDirectoryOfSettings const&) = delete;
  TDirectoryOfSettings& operator=(TDirectoryOfSettings const&) = delete;

private:
  std::filesystem::path fOld;
  char fPath[32] = "/tmp/zep-growth-bench.XXXXXX";
};

void ReadSettings_Growth(benchmark::State& state) {
  TDirectoryOfSettings const directory(SizeOf(state));
  for (auto _ : state) {
    TConfig config;
    if (config.getValue("collector.setting.1000007").empty()) throw std::runtime_error("settings lost");
  }
}
BENCHMARK(ReadSettings_Growth)->RangeMultiplier(10)->Range(1000, 100000)->Unit(benchmark::kMicrosecond);

}  // namespace
