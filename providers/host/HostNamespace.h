#pragma once

#include "ICIMNamespace.h"

namespace NQRVZEP20 {

// Collects what this machine says of itself, and makes a namespace of it. Where the machine keeps silent, the namespace
// says why (TNamespaceWriter).
boost::shared_ptr<ICIMNamespace> MakeHostNamespace();

}  // namespace NQRVZEP20
