// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "ICIMNamespace.h"

namespace NQRVZEP20 {

// The entry object of a provider plug-in. The plug-in creates one when it is loaded and registers it with
// TNamespaceProviderManager, which stores it under its name until the end of the process.
class ZEP_EXPORT INamespaceProvider {
public:
  virtual ~INamespaceProvider();

  // The name under which the provider is registered. Called once, at registration, with an empty context.
  virtual std::string const& GetName(TCIMContext const& context) const = 0;

  // The namespace of the provider, which the provider owns; the same one on each call. The first call may block while the
  // provider collects its data. The pointer is empty if the provider has no namespace. Has a default body, which returns an
  // empty pointer.
  virtual boost::shared_ptr<ICIMNamespace> GetNamespace(TCIMContext const& /*context*/) { return {}; }
};

}  // namespace NQRVZEP20
