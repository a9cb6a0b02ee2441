// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "TCIMReference.h"

#include <string>

namespace NQRVZEP20 {

// The key bindings of a path as one text, which two paths share when they name the same instance of a class. Names are
// compared without regard to case and in any order, values by their text as an object path prints it, but reals with every
// digit; two datetimes that denote one instant in two zones are two keys. A key that is NULL is left out; without any the
// text is empty.
std::string KeyText(TCIMReference const& path);

}  // namespace NQRVZEP20
