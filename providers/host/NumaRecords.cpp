// SPDX-License-Identifier: Apache-2.0
#include "NumaRecords.h"

#include "CpuList.h"
#include "ExtentRecord.h"
#include "MemoryTotals.h"

#include <charconv>

namespace NQRVZEP20 {

namespace {

std::string const kNodes = "/sys/devices/system/node/";

// "10 21": the relative cost of reaching each node, which is 10 for the node itself.
TFinding<std::vector<std::uint32_t>> DistancesFrom(std::string const& text) {
  std::vector<std::uint32_t> distances;
  char const* at = text.data();
  char const* const end = at + text.size();
  while (at != end) {
    std::uint32_t distance = 0;
    auto const [stop, error] = std::from_chars(at, end, distance);
    if (error != std::errc()) return TMissing{kMissingUnexpected, "\"" + text + "\" is not a list of distances"};
    distances.push_back(distance);
    at = stop;
    while (at != end && *at == ' ') ++at;
  }
  return distances;
}

bool IsNode(std::string const& name) {
  return name.size() > 4 && name.compare(0, 4, "node") == 0 && name.find_first_not_of("0123456789", 4) == std::string::npos;
}

// `list`: of the node's CPUs.
TRecord NodeRecord(TMachineFiles const& files, TSystemName const& name, std::string const& number,
                   TFinding<std::string> const& list) {
  std::string const directory = kNodes + "node" + number + "/";
  TMemInfo const memory = TMemInfo::ReadFrom(files, directory + "meminfo");
  TRecord record = ExtentRecord("ZEP_NUMANode", kNodes.c_str(), name, "NUMA node " + number, "NUMA node " + number,
                                memory.Bytes("MemTotal"), "CIM_Memory");
  record.Add("CPUs", list);
  record.Add("FreeMemory", memory.Bytes("MemFree")).Unit("byte");
  record.Add("Distances", files.Line(directory + "distance").Then(DistancesFrom));
  return record;
}

}  // namespace

std::vector<TNumaNode> NumaNodes(TMachineFiles const& files, TSystemName const& name) {
  std::vector<TNumaNode> nodes;
  for (std::string const& node : files.Names(kNodes)) {
    if (!IsNode(node)) continue;
    auto const list = files.Line(kNodes + node + "/cpulist");
    nodes.push_back({list ? CpusIn(*list) : std::vector<unsigned>(), NodeRecord(files, name, node.substr(4), list)});
  }
  return nodes;
}

TRecord NumaShape(TSystemName const& name) {
  return NodeRecord(TMachineFiles("/nonexistent"), name, "", TMissing{kMissingNotDescribed, "not read"});
}

}  // namespace NQRVZEP20
