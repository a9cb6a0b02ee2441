// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <cstdint>
#include <string>

namespace NQRVZEP20::zep {

struct TPacFile {
  std::string fText;
  std::string fFailure;  // why the file could not be fetched; empty when it was
};

// Fetches a proxy configuration file by plain HTTP, without a proxy, with the libcurl of the system: at most `mostBytes` (0: any
// number), in at most 30 seconds.
TPacFile FetchPacFile(std::string const& url, std::uint64_t mostBytes);

}  // namespace NQRVZEP20::zep
