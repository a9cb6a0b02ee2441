// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "ICIMNamespace.h"
#include "providers/mof/MofTree.h"

#include <string>

namespace NQRVZEP20 {

// Values as MOF writes them.

// For what MOF cannot say: kZEPStatusNotSupported.
[[noreturn]] void ThrowUnprintable();

// The literal, or the array of them, as a value of that type. References are object paths in strings, in `ns`. Throws
// TMofError for what is not of the type or does not fit it.
TCIMValue ReadMofValue(TMofValue const& value, TCIMValue::TCIMType type, unsigned int maxArraySize,
                       boost::shared_ptr<ICIMNamespace> ns);

// A scalar, as one literal in one line; NULL too. Throws kZEPStatusNotSupported for what has no literal.
std::string MofScalarText(TCIMValue const& value);

// An object path as DSP0004 writes it: `X_Disk.Id=5,Name="a\"b"`. Keys are numbers, words or quoted strings; a key that is
// a reference is a quoted path. What stands before the class, up to a ":", is dropped. `place` is where errors point.
TCIMValue ReadMofPath(std::string const& path, TMofPlace const& place, boost::shared_ptr<ICIMNamespace> ns);
std::string MofPathText(TCIMReference const& path);

}  // namespace NQRVZEP20
