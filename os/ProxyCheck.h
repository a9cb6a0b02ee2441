// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "TZEPStatusCode.h"

#include <string>

namespace NQRVZEP20 {

struct TProxyAnswer {
  TZEPStatusCode fStatus;
  std::string fReason;  // the error text of libcurl when the fetch failed; may be empty
};

// Does what TOSSpecific::CheckProxySetting documents, and returns the reason for a failing fetch as well.
TProxyAnswer CheckProxy(std::string const& proxy, std::string const& port, std::string const& userAndPassword);

}  // namespace NQRVZEP20
