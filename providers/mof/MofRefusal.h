// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "providers/mof/TMofError.h"

#include <string>

namespace NQRVZEP20 {

// Does one step with a namespace. What it refuses becomes an error at that place; a status that is expected gets words of
// its own.
template <class TStep>
auto AtPlace(TMofPlace const& place, EZEPStatusCode expected, char const* words, TStep const& step) {
  try {
    return step();
  } catch (TMofError const&) {
    throw;
  } catch (TZEPException const& reason) {
    EZEPStatusCode const status = reason.GetStatusCode().GetCode();
    std::string const name = NameAt(place);
    throw TMofError(place, status == expected ? name + " " + words : name + " is refused: " + reason.what(), status);
  }
}

}  // namespace NQRVZEP20
