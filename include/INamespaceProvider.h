// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "ICIMNamespace.h"

namespace NQRVZEP20 {

// A provider plug-in's entry object. The plug-in creates one when it is loaded and registers it with
// TNamespaceProviderManager, which files it under its name and keeps it until the end of the process.
class ZEP_EXPORT INamespaceProvider {
public:
  virtual ~INamespaceProvider();

  // The name under which the provider is registered. Called once, at registration, with an empty context.
  virtual std::string const& GetName(TCIMContext const& context) const = 0;

  // The namespace that the provider owns, the same one on each call. The first call may block while the provider collects
  // its data. Empty when the provider has no namespace to offer, as in this default body.
  virtual boost::shared_ptr<ICIMNamespace> GetNamespace(TCIMContext const& /*context*/) { return {}; }
};

}  // namespace NQRVZEP20
