// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "collect/TNamespaceView.h"

#include <string>

namespace NQRVZEP20 {

// A view of a MOF file: a new namespace "mof" with the declarations and instances of the file and of the files that it
// includes. The provider's name is the path of the file. Throws TMofError (TMofError.h), whose message begins with the location
// of the error, if the file cannot be read or is not correct. Blocks while it reads.
TNamespaceView ViewOfMof(std::string const& file);

}  // namespace NQRVZEP20
