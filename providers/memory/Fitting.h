// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "TCIMValue.h"

namespace NQRVZEP20 {

// Converts the value to the type of `pattern` if nothing is lost, so that providers can write plain literals: a value of tag 0
// becomes a NULL of that type, an integer takes the declared width and sign if the number fits, and an array takes the declared
// maximum size. Any other value is returned unchanged.
TCIMValue FittedTo(TCIMValue const& pattern, TCIMValue const& value);

}  // namespace NQRVZEP20
