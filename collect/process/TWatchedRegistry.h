// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "TNamespaceProviderManager.h"

#include <functional>
#include <string>
#include <vector>

namespace NQRVZEP20 {

// The provider registry of a plug-in process. It extends the registry of the library, and reports each registration.
class TWatchedRegistry : public TNamespaceProviderManager {
public:
  struct TEvents {
    std::function<void()> fBegins;                          // a registration begins
    std::function<void(std::string const& name)> fEnds;     // the provider has been registered
    std::function<void(std::string const& name)> fIsTaken;  // it has not, because its name is taken
  };

  TWatchedRegistry(boost::shared_ptr<TNamespaceProviderManager> registry, TEvents events);

  void RegisterNamespaceProvider(boost::shared_ptr<INamespaceProvider> provider) override;
  boost::shared_ptr<INamespaceProvider> GetNamespaceProvider(std::string const& name) const override;
  void EnumerateNamespaceProviders(boost::function<bool(boost::shared_ptr<INamespaceProvider>)> callback) override;

  // The providers that were registered through this object, in the order of their names.
  std::vector<boost::shared_ptr<INamespaceProvider>> NewProviders() const;

private:
  bool Has(std::string const& name) const;

  boost::shared_ptr<TNamespaceProviderManager> const fRegistry;
  TEvents const fEvents;
  std::map<std::string, boost::shared_ptr<INamespaceProvider>> fNew;  // by name
};

}  // namespace NQRVZEP20
