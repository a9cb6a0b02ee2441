// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "collect/PlugIns.h"

#include <chrono>
#include <cstdint>
#include <string>
#include <unordered_map>
#include <vector>

namespace NQRVZEP20 {

// Measures the highest growth of the resident memory of this process since the construction or the last Restart. On a kernel
// that cannot reset its own record of the highest value (/proc/self/clear_refs), the record of earlier steps counts, too.
class TMemoryMeter {
public:
  TMemoryMeter() { Restart(); }
  void Restart();
  std::uint64_t PeakBytes() const;  // 0 without /proc

private:
  std::uint64_t fStart = 0;
};

// Measures the cost of each class while instances are read one after the other. The memory of a series of instances of one class
// is measured at its end, so the memory of its first instance is that of the class before it.
class TClassMeter {
public:
  void Note(std::string const& className);  // an instance of the class has been read
  std::vector<TClassCost> const& Finish();  // in the order of the first instances

private:
  using TClock = std::chrono::steady_clock;

  void EndSeries();

  std::vector<TClassCost> fCosts;
  std::unordered_map<std::string, std::size_t> fNumbers;  // in fCosts, by class
  TClassCost* fSeries = nullptr;                          // of the class whose instances are being read
  TMemoryMeter fMemory;
  TClock::time_point fRead = TClock::now();  // when the last instance had been read
};

// The text of a message kCost. A cost without a class is that of a load or a fill, of which only the memory counts. CostFrom
// throws TBadAnswer.
std::string BytesOf(TClassCost const& cost);
TClassCost CostFrom(std::string const& bytes);

}  // namespace NQRVZEP20
