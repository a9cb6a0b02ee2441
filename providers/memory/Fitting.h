// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "TCIMValue.h"

namespace NQRVZEP20 {

// The value as one of the type of `pattern`, where that loses nothing, so that literals can be written plainly: a value of
// tag 0 becomes a NULL of that type, an integer changes its width and sign when the number fits, and an array takes the
// declared bound. Any other value comes back as it is.
TCIMValue FittedTo(TCIMValue const& pattern, TCIMValue const& value);

}  // namespace NQRVZEP20
