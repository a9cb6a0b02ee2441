// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "ICIMClass.h"

#include <string>

namespace NQRVZEP20::zep {

// The part of a schema that instances of a class need, as MOF: the class, the classes above it, those that their references name,
// and the qualifiers that they use. Methods are left out. Throws what the namespace throws.
std::string SchemaPartOf(boost::shared_ptr<ICIMClass> cls);

}  // namespace NQRVZEP20::zep
