// SPDX-License-Identifier: Apache-2.0
#include "collect/process/Costs.h"

#include "collect/answer/TBadAnswer.h"
#include "collect/answer/TByteReader.h"
#include "collect/answer/TByteWriter.h"

#include <algorithm>
#include <cmath>
#include <fstream>

namespace NQRVZEP20 {

namespace {

constexpr std::uint64_t kMostMicroseconds = 1'000'000'000'000'000;

// A line of /proc/self/status, such as "VmHWM:     1234 kB", in bytes; 0 when it is missing.
std::uint64_t StatusBytes(std::string const& name) {
  std::ifstream status("/proc/self/status");
  for (std::string line; std::getline(status, line);)
    if (line.rfind(name + ":", 0) == 0) return std::stoull(line.substr(name.size() + 1)) * 1024;
  return 0;
}

}  // namespace

void TMemoryMeter::Restart() {
  std::ofstream("/proc/self/clear_refs") << 5;  // the highest value becomes the present one (proc(5))
  fStart = StatusBytes("VmRSS");
}

std::uint64_t TMemoryMeter::PeakBytes() const {
  std::uint64_t const highest = StatusBytes("VmHWM");
  return highest - std::min(highest, fStart);
}

void TClassMeter::Note(std::string const& className) {
  auto const [place, isNew] = fNumbers.try_emplace(className, fCosts.size());
  if (fSeries == nullptr || fSeries->fClass != className) EndSeries();
  if (isNew) fCosts.push_back({className});
  fSeries = &fCosts[place->second];
  ++fSeries->fInstances;
  TClock::time_point const now = TClock::now();
  fSeries->fMilliseconds += std::chrono::duration<double, std::milli>(now - fRead).count();
  fRead = now;
}

std::vector<TClassCost> const& TClassMeter::Finish() {
  EndSeries();
  return fCosts;
}

void TClassMeter::EndSeries() {
  if (fSeries == nullptr) return;
  fSeries->fPeakBytes = std::max(fSeries->fPeakBytes, fMemory.PeakBytes());
  fSeries = nullptr;
  fMemory.Restart();
}

std::string BytesOf(TClassCost const& cost) {
  TByteWriter writer;
  writer.Text(cost.fClass);
  writer.Number(cost.fInstances);
  writer.Number(static_cast<std::uint64_t>(std::llround(cost.fMilliseconds * 1000)));
  writer.Number(cost.fPeakBytes);
  return writer.Bytes();
}

TClassCost CostFrom(std::string const& bytes) {
  TByteReader reader(bytes);
  TClassCost cost;
  cost.fClass = reader.Name();
  cost.fInstances = reader.Number();
  cost.fMilliseconds = static_cast<double>(reader.NumberUpTo(kMostMicroseconds, "a time")) / 1000;
  cost.fPeakBytes = reader.Number();
  if (reader.Left() != 0) throw TBadAnswer("bytes follow it");
  return cost;
}

}  // namespace NQRVZEP20
