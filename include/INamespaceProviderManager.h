// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "INamespaceProvider.h"

namespace NQRVZEP20 {

// The registry of namespace providers; TRootObject::GetNamespaceProviderManager() returns it.
//
// No lock is taken: load all plug-ins, which registers their providers, before several threads use the registry.
class ZEP_EXPORT INamespaceProviderManager {
public:
  virtual ~INamespaceProviderManager();

  // Registers the provider under the name that its GetName returns. If a provider with this name is already registered, the
  // new one is silently ignored. Kept. Names are compared byte by byte, so case matters. An empty pointer is a failed
  // assertion.
  virtual void RegisterNamespaceProvider(boost::shared_ptr<INamespaceProvider> provider) = 0;

  // Logs an error and throws a TZEPFailure with kZEPStatusNotFound if no provider has that name.
  virtual boost::shared_ptr<INamespaceProvider> GetNamespaceProvider(std::string const& name) const = 0;

  // Visits the providers in byte order of their names, until a call returns false.
  virtual void EnumerateNamespaceProviders(boost::function<bool(boost::shared_ptr<INamespaceProvider>)> callback) = 0;
};

}  // namespace NQRVZEP20
