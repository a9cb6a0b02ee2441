// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "ICIMNamespace.h"
#include "TCIMValue.h"

#include <string>

namespace NQRVZEP20 {

// The value as text: two values have the same text only when they are equal to the last bit, including the types of NULLs, bounds
// of arrays, the bits of reals, and the classes, labels and keys of references.
std::string DumpOf(TCIMValue const& value);
std::string DumpOf(TCIMReference const& reference);

// Everything that the operations of the namespace and of its elements return. An exception is a line of the text.
std::string DumpOf(ICIMNamespace const& ns);

}  // namespace NQRVZEP20
