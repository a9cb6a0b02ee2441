// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <cstdlib>
#include <string>

namespace NQRVZEP20 {

// The path on the server for an upload to a host: on bootable media (ZEP_ISBOOTABLE is "yes") always in the directory that the
// maker's server has for them.
inline std::string RemotePathOf(std::string const& remoteName) {
  char const* const isBootable = std::getenv("ZEP_ISBOOTABLE");
  if (isBootable != nullptr && std::string(isBootable) == "yes") return "hostline/toqrv/vantor/fdr_upload/" + remoteName;
  return remoteName;
}

}  // namespace NQRVZEP20
