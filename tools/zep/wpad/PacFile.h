// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <string>

namespace NQRVZEP20::zep {

struct TPacFile {
  std::string fText;
  std::string fFailure;  // why there is none; empty when there is
};

// Fetches a proxy configuration file through plain HTTP, past every proxy, by the libcurl of the system. At most 1 MiB, and at
// most 30 seconds.
TPacFile FetchPacFile(std::string const& url);

}  // namespace NQRVZEP20::zep
