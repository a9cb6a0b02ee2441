// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <exception>
#include <new>
#include <string>

namespace NQRVZEP20 {

// The text of the exception, or an empty string if it has none.
inline std::string TextOf(std::exception const& failure) {
  char const* const text = failure.what();
  return text != nullptr ? text : "";
}

// Calls `work`, which runs code of a plug-in, and returns the reason why it failed, or an empty string if it succeeded. Catches
// every exception, because a plug-in may throw any type. If there is not enough memory for the reason, returns "std::bad_alloc".
template <class TWork>
std::string FailureOf(TWork work) {
  try {
    try {
      work();
      return "";
    } catch (std::exception const& failure) {
      std::string const why = TextOf(failure);
      return why.empty() ? "it threw an exception without a text" : why;
    } catch (...) {
      return "it threw an object that is not a std::exception";
    }
  } catch (std::bad_alloc const&) {
    return "std::bad_alloc";  // short enough to need no memory
  }
}

}  // namespace NQRVZEP20
