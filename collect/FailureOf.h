// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <exception>
#include <string>

namespace NQRVZEP20 {

// Calls `work`, which runs code of a plug-in, and returns the reason why it failed, or an empty string if it succeeded. Catches
// every exception, because a plug-in may throw any type.
template <class TWork>
std::string FailureOf(TWork work) {
  try {
    work();
    return "";
  } catch (std::exception const& failure) {
    std::string const why = failure.what();
    return why.empty() ? "it threw an exception without a text" : why;
  } catch (...) {
    return "it threw an object that is not a std::exception";
  }
}

}  // namespace NQRVZEP20
