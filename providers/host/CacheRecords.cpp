// SPDX-License-Identifier: Apache-2.0
#include "CacheRecords.h"

#include "CpuList.h"
#include "ExtentRecord.h"
#include "ValueNames.h"

#include <algorithm>
#include <charconv>
#include <map>
#include <set>

namespace NQRVZEP20 {

namespace {

constexpr unsigned kMostIndexes = 16;
constexpr char const* kSource = "/sys/devices/system/cpu";

constexpr struct {
  unsigned fWays;
  std::uint16_t fNumber;
} kAssociativities[] = {{1, 2}, {2, 3}, {4, 4}, {8, 6}, {16, 7}, {12, 8}, {24, 9}, {32, 10}, {48, 11}, {64, 12}, {20, 13}};

std::string TypeLetter(std::string const& type) {
  if (type == "Data") return "d";
  return type == "Instruction" ? "i" : "";
}

// The constant facts of the caches with one index and size, which are read once because a machine may have hundreds of caches.
struct TKind {
  std::string fType;
  unsigned fLevel;
  TFinding<std::uint32_t> fLineSize, fWays;
};

class TCacheReader {
public:
  explicit TCacheReader(TMachineFiles const& files) : fFiles(files) {}

  // Adds the caches of this CPU that are not known yet.
  void Read(unsigned cpu) {
    for (unsigned index = 0; index < kMostIndexes; ++index) {
      if (fKnown[index].count(cpu) > 0) continue;
      std::string const directory = CpuDirectory(cpu) + "cache/index" + std::to_string(index) + "/";
      auto const list = fFiles.Line(directory + "shared_cpu_list");
      auto const cpus = list ? CpusIn(*list) : std::vector<unsigned>();
      if (cpus.empty()) return;
      fKnown[index].insert(cpus.begin(), cpus.end());
      Add(directory, index, cpus);
    }
  }

  std::vector<TCache> const& Caches() const { return fCaches; }

private:
  void Add(std::string const& directory, unsigned index, std::vector<unsigned> const& cpus) {
    auto const size = fFiles.Line(directory + "size");
    TKind const* const kind = KindOf(directory, index, size ? *size : "");
    if (kind == nullptr) return;
    std::string const name = "L" + std::to_string(kind->fLevel) + TypeLetter(kind->fType);
    fCaches.push_back({name + " " + std::to_string(fCounts[name]++), kind->fLevel, kind->fType, cpus, size.Then(CacheSizeFrom),
                       kind->fLineSize, kind->fWays});
  }

  TKind const* KindOf(std::string const& directory, unsigned index, std::string const& size) {
    auto const [found, isNew] = fKinds.try_emplace({index, size}, nullptr);
    auto const level = isNew ? fFiles.Number<unsigned>(directory + "level") : TFinding<unsigned>(TMissing());
    if (level) {
      auto const type = fFiles.Line(directory + "type");
      found->second = std::make_unique<TKind>(TKind{type ? *type : "", *level,
                                                    fFiles.Number<std::uint32_t>(directory + "coherency_line_size"),
                                                    fFiles.Number<std::uint32_t>(directory + "ways_of_associativity")});
    }
    return found->second.get();
  }

  TMachineFiles const& fFiles;
  std::map<unsigned, std::set<unsigned>> fKnown;  // by index: the CPUs whose cache was added
  std::map<std::pair<unsigned, std::string>, std::unique_ptr<TKind>> fKinds;
  std::map<std::string, unsigned> fCounts;  // by name
  std::vector<TCache> fCaches;
};

std::uint16_t LevelFrom(unsigned level) { return static_cast<std::uint16_t>(level >= 1 && level <= 3 ? level + 2 : 1); }

std::uint16_t TypeFrom(std::string const& type) {
  if (type == "Instruction") return 2;
  if (type == "Data") return 3;
  return type == "Unified" ? 4 : 0;
}

// The kernel reports 0 ways for a fully associative cache.
std::uint16_t AssociativityFrom(std::uint32_t ways) {
  constexpr std::uint16_t other = 1, full = 5;
  if (ways == 0) return full;
  for (auto const& [count, number] : kAssociativities)
    if (count == ways) return number;
  return other;
}

}  // namespace

std::vector<TCache> CachesOf(TKernelProcessors const& processors, TMachineFiles const& files) {
  TCacheReader reader(files);
  for (auto const& socket : processors.GetSockets())
    for (auto const& core : socket.fCores)
      for (unsigned cpu : core.fCpus) reader.Read(cpu);
  return reader.Caches();
}

TRecord CacheRecord(TCache const& cache, TSystemName const& name) {
  return ExtentRecord("CIM_Memory", kSource, name, cache.fName + " cache",
                      cache.fName + " cache of CPU " + CpuListOf(cache.fCpus), cache.fBytes);
}

TRecord CacheUse(TCache const& cache) {
  TRecord use("CIM_AssociatedCacheMemory", kSource);
  use.Add("Level", TFinding<std::uint16_t>(LevelFrom(cache.fLevel))).Names(kCacheLevelNames);
  use.Add("CacheType", TFinding<std::uint16_t>(TypeFrom(cache.fType))).Names(kCacheTypeNames);
  use.Add("LineSize", cache.fLineSize).Unit("byte");
  use.Add("Associativity", cache.fWays.Then(AssociativityFrom)).Names(kAssociativityNames);
  return use;
}

TFinding<std::uint64_t> CacheSizeFrom(std::string const& text) {
  std::uint64_t number = 0;
  char const* const end = text.data() + text.size();
  auto const [stop, error] = std::from_chars(text.data(), end, number);
  std::string const unit(error == std::errc() ? stop : end, end);
  constexpr std::uint64_t most = std::uint64_t(1) << 40;
  if (error == std::errc() && number <= most && unit == "K") return number << 10;
  if (error == std::errc() && number <= most && unit == "M") return number << 20;
  return TMissing{kMissingUnexpected, "\"" + text + "\" is not the size of a cache"};
}

}  // namespace NQRVZEP20
