// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "collect/stored/TJsonTree.h"

#include <nlohmann/json.hpp>

#include <cstddef>
#include <string_view>

namespace NQRVZEP20 {

// The limits of a JSON text from a foreign file, so that reading it takes memory and time in proportion to its length.
struct TJsonBounds {
  std::size_t fDeepest;      // levels of objects and arrays
  std::size_t fMostMembers;  // of an object
  std::size_t fMostValues;   // of all kinds together
  // The library compares the name of each member with those before it in its object: this many times in the whole text.
  std::size_t fMostComparisons = 200000000;
};

// Both parse the text up to the first place that is beyond the bounds, and throw TStoredReportError there. They throw
// nlohmann::ordered_json::exception if the text is not JSON.
nlohmann::ordered_json BoundedJson(std::string_view text, TJsonBounds const& bounds);
TJsonTree BoundedTree(std::string_view text, TJsonBounds const& bounds);

}  // namespace NQRVZEP20
