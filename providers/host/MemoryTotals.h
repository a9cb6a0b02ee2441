// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "TSystemName.h"
#include "providers/reasons/TMachineFiles.h"
#include "providers/reasons/TRecord.h"

#include <cstdint>
#include <map>
#include <string>
#include <string_view>

namespace NQRVZEP20 {

// The lines of a meminfo file of the kernel, such as "MemTotal:  982224 kB".
class TMemInfo {
public:
  // `file`: the path, for the reasons. Numbers after a prefix that a NUMA node has, "Node 0 MemTotal: ...", are found, too.
  static TMemInfo ReadFrom(TMachineFiles const& files, std::string const& file);
  TMemInfo(std::string file, TFinding<std::string> const& text);

  // In units of 1024 bytes, as the file has them.
  TFinding<std::uint64_t> Kilobytes(std::string const& name) const;
  TFinding<std::uint64_t> Bytes(std::string const& name) const;

private:
  std::string fFile;
  TMissing fWhyNot;  // its code is empty when the file was read
  std::map<std::string, std::uint64_t> fKilobytes;
};

// The memory that the kernel manages, as an instance of CIM_Memory.
TRecord MainMemoryRecord(TMemInfo const& info, TSystemName const& name);

}  // namespace NQRVZEP20
