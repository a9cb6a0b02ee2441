// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <cstdint>
#include <functional>
#include <string>
#include <utility>
#include <vector>

namespace NQRVZEP20 {

// The limits beyond which the rules report a problem. Each is also a setting (zep.cfg); docs/findings.md has the table.
struct TThresholds {
  std::uint64_t fFileSystemFreePercent = 10;    // a file system with less free space, and with less than the next value,
  std::uint64_t fFileSystemFreeGibibytes = 20;  // is nearly full
  std::uint64_t fFreeInodesPercent = 5;
  std::uint64_t fDiskUsedPercent = 90;         // of the expected life of a disk
  std::uint64_t fReallocatedSectors = 50;      // of a disk
  std::uint64_t fPortErrorsPerMillion = 10;    // packets
  std::uint64_t fCorrectedMemoryErrors = 100;  // of a memory module
  std::uint64_t fCorrectedPciErrors = 1000;    // of a PCI Express device
  std::uint64_t fKernelLogDays = 7;            // after which a record of the kernel's log is no longer judged
  std::uint64_t fEventLogDays = 30;            // the same for an entry of the event log of a management controller
  std::uint64_t fClockGraceMinutes = 15;       // after the start, in which the clock need not be synchronised

  // The defaults, replaced by the settings that the callback has: it gets a key such as "finding-file-system-free-percent" and
  // returns the value, or an empty text. Throws std::invalid_argument, with the key and the range, for a value out of range.
  static TThresholds From(std::function<std::string(std::string const&)> const& setting);

  // The keys of the settings with these values, in the order above.
  std::vector<std::pair<std::string, std::uint64_t>> Settings() const;
};

}  // namespace NQRVZEP20
