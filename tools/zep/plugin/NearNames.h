// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <string>
#include <vector>

namespace NQRVZEP20::zep {

// Those of the names that the user of a wrong name may have meant, the most similar first; at most five. Similar are names with
// few other letters, and names that contain the wrong one. The case of letters does not matter.
std::vector<std::string> NearNames(std::string const& wrong, std::vector<std::string> const& names);

}  // namespace NQRVZEP20::zep
