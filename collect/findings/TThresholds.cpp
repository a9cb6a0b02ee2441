// SPDX-License-Identifier: Apache-2.0
#include "collect/findings/TThresholds.h"

#include <charconv>
#include <stdexcept>

namespace NQRVZEP20 {

namespace {

struct TSetting {
  char const* fKey;
  std::uint64_t TThresholds::*fField;
  std::uint64_t fHighest;
};

constexpr TSetting kSettings[] = {
    {"finding-file-system-free-percent", &TThresholds::fFileSystemFreePercent, 100},
    {"finding-file-system-free-gibibytes", &TThresholds::fFileSystemFreeGibibytes, 1000000},
    {"finding-free-inodes-percent", &TThresholds::fFreeInodesPercent, 100},
    {"finding-disk-used-percent", &TThresholds::fDiskUsedPercent, 255},
    {"finding-reallocated-sectors", &TThresholds::fReallocatedSectors, 1000000},
    {"finding-port-errors-per-million", &TThresholds::fPortErrorsPerMillion, 1000000},
    {"finding-corrected-memory-errors", &TThresholds::fCorrectedMemoryErrors, 1000000000},
    {"finding-corrected-pci-errors", &TThresholds::fCorrectedPciErrors, 1000000000},
    {"finding-kernel-log-days", &TThresholds::fKernelLogDays, 1000000},
    {"finding-event-log-days", &TThresholds::fEventLogDays, 1000000},
    {"finding-clock-grace-minutes", &TThresholds::fClockGraceMinutes, 1000000},
};

std::uint64_t NumberFrom(TSetting const& setting, std::string const& text) {
  std::uint64_t number = 0;
  auto const [end, error] = std::from_chars(text.data(), text.data() + text.size(), number);
  if (error == std::errc() && end == text.data() + text.size() && number <= setting.fHighest) return number;
  throw std::invalid_argument("setting " + std::string(setting.fKey) + ": \"" + text + "\" is not a whole number from 0 to " +
                              std::to_string(setting.fHighest));
}

}  // namespace

TThresholds TThresholds::From(std::function<std::string(std::string const&)> const& setting) {
  TThresholds thresholds;
  for (TSetting const& row : kSettings) {
    std::string const text = setting(row.fKey);
    if (!text.empty()) thresholds.*row.fField = NumberFrom(row, text);
  }
  return thresholds;
}

std::vector<std::pair<std::string, std::uint64_t>> TThresholds::Settings() const {
  std::vector<std::pair<std::string, std::uint64_t>> settings;
  for (TSetting const& row : kSettings) settings.emplace_back(row.fKey, this->*row.fField);
  return settings;
}

}  // namespace NQRVZEP20
