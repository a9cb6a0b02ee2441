// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "collect/TNamespaceView.h"

#include <string>

namespace NQRVZEP20::zep {

// The namespace "mof" with what the file, and what it includes, declares; the file stands for the provider. Throws
// TZEPException, whose text tells the place of what is wrong.
TNamespaceView ViewOfMof(std::string const& file);

}  // namespace NQRVZEP20::zep
