// SPDX-License-Identifier: Apache-2.0
#include "TMemoryProvider.h"

#include "TMemoryNamespace.h"

#include <boost/make_shared.hpp>

namespace NQRVZEP20 {

TMemoryProvider::TMemoryProvider(std::string const& name, std::string const& namespaceName, TFill fill)
    : fName(name), fNamespaceName(namespaceName), fFill(fill) {}

TMemoryProvider::~TMemoryProvider() = default;

std::string const& TMemoryProvider::GetName(TCIMContext const&) const { return fName; }

boost::shared_ptr<ICIMNamespace> TMemoryProvider::GetNamespace(TCIMContext const&) {
  if (!fNamespace) {
    auto const ns = boost::make_shared<TMemoryNamespace>(fNamespaceName);
    fFill(*ns);
    fNamespace = ns;
  }
  return fNamespace;
}

}  // namespace NQRVZEP20
