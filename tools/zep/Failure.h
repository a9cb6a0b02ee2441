#pragma once

#include <exception>
#include <stdexcept>
#include <string>

namespace NQRVZEP20::zep {

// zep was called in a way that it does not know. The text tells what is wrong, and shows no password.
struct TWrongUsage : std::runtime_error {
  using std::runtime_error::runtime_error;
};

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
