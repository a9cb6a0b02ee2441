// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "ICIMNamespace.h"
#include "providers/mof/MofTree.h"

#include <string>

namespace NQRVZEP20 {

// The values of MOF.

// Throws kZEPStatusNotSupported, for a value that MOF cannot express.
[[noreturn]] void ThrowUnprintable();

// The literal, or the array of literals, as a value of that type. A reference is an object path in a string; its class must be in
// `ns`. Throws TMofError for a literal of another type, or one that does not fit.
TCIMValue ReadMofValue(TMofValue const& value, TCIMValue::TCIMType type, unsigned int maxArraySize,
                       boost::shared_ptr<ICIMNamespace> ns);

// A scalar or NULL as one literal, on one line. Throws kZEPStatusNotSupported for a value without a literal.
std::string MofScalarText(TCIMValue const& value);

// An object path in the form of DSP0004: `X_Disk.Id=5,Name="a\"b"`. Keys are numbers, words or quoted strings; a key that is a
// reference is a quoted path. The text before the class, up to a ":", is ignored. Throws TMofError at `span`.
TCIMValue ReadMofPath(std::string const& path, TMofSpan const& span, boost::shared_ptr<ICIMNamespace> ns);
std::string MofPathText(TCIMReference const& path);

}  // namespace NQRVZEP20
