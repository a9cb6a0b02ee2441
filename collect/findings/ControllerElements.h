// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "collect/findings/TRule.h"

namespace NQRVZEP20 {

// The elements of a class that belong to the management controller. Without a controller, notes why the rule could not be asked,
// in the same words for every class.
std::vector<TElement> OfController(TRuleRun& run, char const* className);

// Notes that the list of the controller ("sensors", "event log") was not read to its end, if it was not. Without a controller,
// notes nothing.
void NoteUnread(TRuleRun& run, std::string const& list);

}  // namespace NQRVZEP20
