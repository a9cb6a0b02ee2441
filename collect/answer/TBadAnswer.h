// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <stdexcept>

namespace NQRVZEP20 {

// The bytes of an answer are not in the form of NamespaceBytes.h, or exceed its limits. The text states how, for people.
struct TBadAnswer : std::runtime_error {
  using std::runtime_error::runtime_error;
};

}  // namespace NQRVZEP20
