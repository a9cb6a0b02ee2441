// SPDX-License-Identifier: Apache-2.0

// Compares object paths with hand-written loops over strings, which know neither classes nor types. The calls that a
// reference makes to its namespace are measured separately, because the loops have no counterpart.

#include "ICIMClass.h"
#include "ICIMPropertyDecl.h"
#include "TCIMReference.h"
#include "providers/memory/TMemoryNamespace.h"

#include <benchmark/benchmark.h>

#include <boost/make_shared.hpp>

#include <algorithm>
#include <map>
#include <random>
#include <string>
#include <vector>

namespace {

using namespace NQRVZEP20;

std::string const kPath = "root/cimv2:X_Disk.DeviceID=\"/dev/sda\",Slot=\"12\"";

boost::shared_ptr<TMemoryNamespace> Namespace() {
  static boost::shared_ptr<TMemoryNamespace> const ns = [] {
    auto made = boost::make_shared<TMemoryNamespace>("root/cimv2");
    made->DefineClass("X_Disk").Key("DeviceID", "string").Key("Slot", "uint32");
    return made;
  }();
  return ns;
}

// ---- Reading ----

void Parse_Zep(benchmark::State& state) {
  auto const ns = Namespace();
  for (auto _ : state) {
    TCIMReference reference(ns, kPath, TCIMContext());
    benchmark::DoNotOptimize(reference);
  }
}
BENCHMARK(Parse_Zep);

struct TPathOfStrings {
  std::string fClassName;
  std::map<std::string, std::string> fKeys;
};

bool ReadByHand(std::string const& path, TPathOfStrings& result) {
  std::size_t const colon = path.find(':');
  std::size_t pos = path.find('.', colon);
  if (colon == std::string::npos || pos == std::string::npos) return false;
  result.fClassName = path.substr(colon + 1, pos - colon - 1);
  while (pos < path.size()) {
    std::size_t const equals = path.find("=\"", ++pos);
    if (equals == std::string::npos) return false;
    std::string name = path.substr(pos, equals - pos);
    std::string value;
    for (pos = equals + 2; pos < path.size() && path[pos] != '"'; ++pos) {
      if (path[pos] == '\\') ++pos;
      value += path[pos];
    }
    result.fKeys.emplace(std::move(name), std::move(value));
    ++pos;
  }
  return true;
}

void Parse_LoopOverStrings(benchmark::State& state) {
  for (auto _ : state) {
    TPathOfStrings path;
    benchmark::DoNotOptimize(ReadByHand(kPath, path));
    benchmark::DoNotOptimize(path);
  }
}
BENCHMARK(Parse_LoopOverStrings);

// The calls that reading a path makes to the namespace: for the class, and for each key's declaration, default value and
// type.
void Parse_CallsIntoTheNamespace(benchmark::State& state) {
  auto const ns = Namespace();
  std::string const className = "X_Disk";
  std::vector<std::string> const keys = {"DeviceID", "Slot"};
  for (auto _ : state) {
    auto const cls = ns->GetClass(className, TCIMContext());
    for (std::string const& key : keys) {
      auto const declaration = cls->GetPropertyDecl(key, TCIMContext());
      benchmark::DoNotOptimize(declaration->GetDefaultValue(TCIMContext()).IsReference());
      benchmark::DoNotOptimize(declaration->GetType(TCIMContext()));
    }
  }
}
BENCHMARK(Parse_CallsIntoTheNamespace);

// ---- Printing ----

void Print_Zep(benchmark::State& state) {
  auto const ns = Namespace();
  TCIMReference const reference(ns, kPath, TCIMContext());
  for (auto _ : state) {
    std::string path = reference.GetPath();
    benchmark::DoNotOptimize(path);
  }
}
BENCHMARK(Print_Zep);

std::string PrintByHand(TPathOfStrings const& path) {
  std::string text = path.fClassName;
  char before = '.';
  for (auto const& [name, value] : path.fKeys) {
    text += before;
    text += name;
    text += "=\"";
    for (char const c : value) {
      if (c == '"' || c == '\\') text += '\\';
      text += c;
    }
    text += '"';
    before = ',';
  }
  return text;
}

void Print_LoopOverStrings(benchmark::State& state) {
  TPathOfStrings path;
  ReadByHand(kPath, path);
  for (auto _ : state) {
    std::string text = PrintByHand(path);
    benchmark::DoNotOptimize(text);
  }
}
BENCHMARK(Print_LoopOverStrings);

void Print_CallsIntoTheNamespace(benchmark::State& state) {
  auto const ns = Namespace();
  auto const cls = ns->GetClass("X_Disk", TCIMContext());
  for (auto _ : state) {
    std::string name = cls->GetName(TCIMContext());
    benchmark::DoNotOptimize(name);
  }
}
BENCHMARK(Print_CallsIntoTheNamespace);

// ---- As keys of a map ----

std::vector<TCIMReference> const& ManyReferences() {
  static std::vector<TCIMReference> const references = [] {
    auto const ns = Namespace();
    std::vector<TCIMReference> made;
    for (unsigned int slot = 0; slot < 10000; ++slot)
      made.emplace_back(
          ns, "root/cimv2:X_Disk.DeviceID=\"/dev/sd" + std::to_string(slot % 100) + "\",Slot=\"" + std::to_string(slot) + "\"",
          TCIMContext());
    std::shuffle(made.begin(), made.end(), std::mt19937(1));
    return made;
  }();
  return references;
}

void Map_KeyedByReferences(benchmark::State& state) {
  std::vector<TCIMReference> const& references = ManyReferences();
  for (auto _ : state) {
    std::map<TCIMReference, int> map;
    for (TCIMReference const& reference : references) map.emplace(reference, 0);
    benchmark::DoNotOptimize(map);
  }
}
BENCHMARK(Map_KeyedByReferences)->Unit(benchmark::kMicrosecond);

void Map_KeyedByTheirTexts(benchmark::State& state) {
  std::vector<TCIMReference> const& references = ManyReferences();
  for (auto _ : state) {
    std::map<std::string, int> map;
    for (TCIMReference const& reference : references) map.emplace(reference.GetPath(), 0);
    benchmark::DoNotOptimize(map);
  }
}
BENCHMARK(Map_KeyedByTheirTexts)->Unit(benchmark::kMicrosecond);

void Map_KeyedByTextsThatAreThere(benchmark::State& state) {
  std::vector<std::string> texts;
  for (TCIMReference const& reference : ManyReferences()) texts.push_back(reference.GetPath());
  for (auto _ : state) {
    std::map<std::string, int> map;
    for (std::string const& text : texts) map.emplace(text, 0);
    benchmark::DoNotOptimize(map);
  }
}
BENCHMARK(Map_KeyedByTextsThatAreThere)->Unit(benchmark::kMicrosecond);

}  // namespace
