// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <exception>
#include <string>

namespace NQRVZEP20 {

// Calls `work`, which runs code of a plug-in, and returns why it failed; empty when it succeeded. A plug-in may throw anything,
// so nothing that `work` throws leaves this function.
template <class TWork>
std::string FailureOf(TWork work) {
  try {
    work();
    return "";
  } catch (std::exception const& failure) {
    return failure.what();
  } catch (...) {
    return "it threw something that is not a std::exception";
  }
}

}  // namespace NQRVZEP20
