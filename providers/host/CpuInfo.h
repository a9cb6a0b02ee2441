// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "providers/reasons/TFinding.h"

#include <string>
#include <string_view>
#include <utility>
#include <vector>

namespace NQRVZEP20 {

// The lines of /proc/cpuinfo for one logical CPU: names and values, such as "model name" and "microcode". Refers to the text that
// it was parsed from, which must outlive it.
class TCpuInfo {
public:
  explicit TCpuInfo(unsigned number) : fNumber(number) {}

  void Add(std::string_view name, std::string_view value) { fValues.emplace_back(name, value); }

  unsigned GetNumber() const { return fNumber; }

  // The value of the first line with that name. Missing if there is none or it is empty.
  TFinding<std::string> Text(std::string_view name) const;

  // The words of the line "flags", or "Features" on ARM; none without such a line.
  std::vector<std::string> Flags() const;
  bool HasFlag(std::string_view flag) const;

private:
  unsigned fNumber;
  std::vector<std::pair<std::string_view, std::string_view>> fValues;
};

// The logical CPUs in the text of /proc/cpuinfo, in its order. A CPU begins at a line "processor: NUMBER"; lines before the first
// CPU, and lines without a colon, are ignored.
std::vector<TCpuInfo> ParseCpuInfo(std::string_view text);

}  // namespace NQRVZEP20
