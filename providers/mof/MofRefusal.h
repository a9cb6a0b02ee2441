// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "providers/mof/TMofError.h"

#include <string>

namespace NQRVZEP20 {

// Runs one step on a namespace. An exception of the namespace becomes a TMofError at `span`. Its message is the name at `span`
// followed by `words` if the status is `expected`, and otherwise the name of the status.
template <class TStep>
auto StepAt(TMofSpan const& span, EZEPStatusCode expected, char const* words, TStep const& step) {
  try {
    return step();
  } catch (TMofError const&) {
    throw;
  } catch (TZEPException const& reason) {
    EZEPStatusCode const status = reason.GetStatusCode().GetCode();
    std::string const name = TextAt(span);
    throw TMofError(span, status == expected ? name + " " + words : name + " is refused: " + reason.what(), status);
  }
}

}  // namespace NQRVZEP20
