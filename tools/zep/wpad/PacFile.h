// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <cstdint>
#include <string>

namespace NQRVZEP20::zep {

struct TPacFile {
  std::string fText;
  std::string fFailure;  // why the file could not be fetched; empty on success
};

// Fetches a proxy configuration file over plain HTTP, without a proxy, with the system's libcurl: at most `mostBytes` bytes (0:
// no limit). Blocks for at most 30 seconds.
TPacFile FetchPacFile(std::string const& url, std::uint64_t mostBytes);

}  // namespace NQRVZEP20::zep
