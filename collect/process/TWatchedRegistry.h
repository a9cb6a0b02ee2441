// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "TNamespaceProviderManager.h"

#include <functional>
#include <string>
#include <vector>

namespace NQRVZEP20 {

// The registry of providers in the process of a plug-in. It adds to the registry of the library, and reports what is registered.
class TWatchedRegistry : public TNamespaceProviderManager {
public:
  struct TEvents {
    std::function<void()> fBegins;                          // a registration
    std::function<void(std::string const& name)> fEnds;     // the provider is registered
    std::function<void(std::string const& name)> fIsTaken;  // it is not, because another one has its name
  };

  TWatchedRegistry(boost::shared_ptr<TNamespaceProviderManager> registry, TEvents events);

  void RegisterNamespaceProvider(boost::shared_ptr<INamespaceProvider> provider) override;
  boost::shared_ptr<INamespaceProvider> GetNamespaceProvider(std::string const& name) const override;
  void EnumerateNamespaceProviders(boost::function<bool(boost::shared_ptr<INamespaceProvider>)> callback) override;

  // The providers that were registered here, in the order of their names.
  std::vector<boost::shared_ptr<INamespaceProvider>> NewProviders() const;

private:
  bool Has(std::string const& name) const;

  boost::shared_ptr<TNamespaceProviderManager> const fRegistry;
  TEvents const fEvents;
  std::map<std::string, boost::shared_ptr<INamespaceProvider>> fNew;  // by name
};

}  // namespace NQRVZEP20
