// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "TNamespaceProviderManager.h"

#include <functional>
#include <map>
#include <set>
#include <string>

namespace NQRVZEP20 {

// The provider registry of a plug-in process. It extends the registry of the library, and reports each registration.
// The name of a provider is the one that it has when its registration begins.
class TWatchedRegistry : public TNamespaceProviderManager {
public:
  struct TEvents {
    std::function<void()> fBegins;                          // a registration begins
    std::function<void(std::string const& name)> fEnds;     // the provider has been registered
    std::function<void(std::string const& name)> fIsTaken;  // it has not, because its name is taken
  };

  using TProviders = std::map<std::string, boost::shared_ptr<INamespaceProvider>>;

  TWatchedRegistry(boost::shared_ptr<TNamespaceProviderManager> registry, TEvents events);

  void RegisterNamespaceProvider(boost::shared_ptr<INamespaceProvider> provider) override;
  boost::shared_ptr<INamespaceProvider> GetNamespaceProvider(std::string const& name) const override;
  void EnumerateNamespaceProviders(boost::function<bool(boost::shared_ptr<INamespaceProvider>)> callback) override;

  // The providers that were registered through this object so far, by the names that they had then.
  TProviders NewProviders() const { return fNew; }

private:
  boost::shared_ptr<TNamespaceProviderManager> const fRegistry;
  TEvents const fEvents;
  std::set<std::string> fTaken;  // the names of all providers
  TProviders fNew;
};

}  // namespace NQRVZEP20
