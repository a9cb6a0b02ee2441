#pragma once

#include <stdexcept>

namespace NQRVZEP20::zep {

// A name that zep does not hand on to the library: wrong usage.
struct TUnfitName : std::runtime_error {
  using std::runtime_error::runtime_error;
};

}  // namespace NQRVZEP20::zep
