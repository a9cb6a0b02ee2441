// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <stdexcept>

namespace NQRVZEP20 {

// The received bytes do not have the format of NamespaceBytes.h, or exceed its limits. The message gives the details in
// human-readable form.
struct TBadAnswer : std::runtime_error {
  using std::runtime_error::runtime_error;
};

}  // namespace NQRVZEP20
