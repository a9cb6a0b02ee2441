#pragma once

#include <exception>
#include <string>

namespace NQRVZEP20::zep {

// Runs what a plug-in has a part in, and returns why it failed, or an empty text. A plug-in may throw anything.
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
