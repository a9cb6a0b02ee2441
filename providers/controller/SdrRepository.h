// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "Ipmi.h"
#include "SdrRecord.h"

#include <functional>
#include <string>
#include <vector>

namespace NQRVZEP20 {

// Reports how much of a slow step is done. `all` is at least `done`: it grows if there is more than the controller reported.
using TProgress = std::function<void(char const* step, std::size_t done, std::size_t all)>;

// The sensor data records of a controller, each with its header.
struct TSdrRepository {
  std::vector<std::string> fRecords;
  TFinding<bool> fIsComplete = true;  // otherwise why the records after these were not read
};

// A store of what was read earlier, by a state of the repository that changes with its content.
class ISdrCache {
public:
  virtual ~ISdrCache() = default;
  virtual TFinding<std::vector<std::string>> Load(std::string const& state) const = 0;  // missing if there is none
  virtual void Save(std::string const& state, std::vector<std::string> const& records) const = 0;
};

// Reads the repository, or takes it from the cache if the controller reports the same number of records and the same times of the
// last addition and deletion. A controller without such times is not cached. `cache`: may be null. Missing if the
// controller has no repository.
TFinding<TSdrRepository> ReadSdrRepository(TIpmi const& ipmi, ISdrCache const* cache, TProgress const& progress);

}  // namespace NQRVZEP20
