// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "collect/TNamespaceView.h"

#include <string>

namespace NQRVZEP20 {

// A MOF file as a view: the new namespace "mof" with the declarations and instances of the file and of the files that it
// includes. The provider's name is the path of the file. Throws TMofError (TMofError.h), whose text begins with the place of the
// mistake, also for a file that cannot be read. Blocks while it reads.
TNamespaceView ViewOfMof(std::string const& file);

}  // namespace NQRVZEP20
