// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "providers/memory/TMemoryNamespace.h"

namespace NQRVZEP20 {

// A namespace of random classes, qualifiers, methods and instances. The same seed gives the same namespace.
boost::shared_ptr<TMemoryNamespace> RandomNamespace(unsigned int seed);

constexpr unsigned int kRandomProviders = 20;  // of the plug-in RandomProviders

}  // namespace NQRVZEP20
