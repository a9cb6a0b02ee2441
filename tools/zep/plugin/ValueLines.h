// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "ICIMClass.h"

#include <string>

namespace NQRVZEP20::zep {

// The C++ lines of a new provider that set the properties of an instance of the class, keys first, in a variable `values` of the
// type TMemoryValues. A key that is not a reference gets an example, every other property NULL, unless the class declares a
// default. A comment above each has its type, the first sentence of its description and the words for its values.
//
// The class can have instances. Its texts may contain anything; the lines compile. Throws what the class throws.
std::string ValueLinesOf(ICIMClass& cls);

}  // namespace NQRVZEP20::zep
