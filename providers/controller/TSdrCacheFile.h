// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "SdrRepository.h"

#include <string>

namespace NQRVZEP20 {

// A file below the user's cache directory ($XDG_CACHE_HOME, or ~/.cache) with the sensor data records of one controller. Only its
// owner can read it. It is replaced as a whole, so that several processes can use it. A file that is damaged, or not
// owned by the user, is ignored.
class TSdrCacheFile : public ISdrCache {
public:
  // `name`: of the server. `identity`: what distinguishes its controller from one that replaces it.
  TSdrCacheFile(std::string const& name, std::string identity);

  TFinding<std::vector<std::string>> Load(std::string const& state) const override;
  void Save(std::string const& state, std::vector<std::string> const& records) const override;

private:
  std::string HeadFor(std::string const& state) const;

  std::string fPath;  // empty without a cache directory
  std::string fIdentity;
};

}  // namespace NQRVZEP20
