// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <exception>
#include <string>

namespace NQRVZEP20::zep {

// Calls `work`, which runs code of a plug-in, and returns why it failed; empty when it did not. A plug-in may throw anything.
template <class TWork>
std::string FailureOf(TWork work) {
  try {
    work();
    return "";
  } catch (std::exception const& failure) {
    return failure.what();
  } catch (...) {
    return "it threw something that is no exception of the standard library";
  }
}

}  // namespace NQRVZEP20::zep
