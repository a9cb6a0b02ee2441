// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <cstdint>
#include <string>

namespace NQRVZEP20::zep {

struct TPacFile {
  std::string fText;
  std::string fFailure;  // why there is none; empty when there is
};

// Fetches a proxy configuration file through plain HTTP, past every proxy, by the libcurl of the system. At most
// `mostBytes` (0: any number), and at most 30 seconds.
TPacFile FetchPacFile(std::string const& url, std::uint64_t mostBytes);

}  // namespace NQRVZEP20::zep
