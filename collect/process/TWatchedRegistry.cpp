// SPDX-License-Identifier: Apache-2.0
#include "collect/process/TWatchedRegistry.h"

namespace NQRVZEP20 {

TWatchedRegistry::TWatchedRegistry(boost::shared_ptr<TNamespaceProviderManager> registry, TEvents events)
    : fRegistry(registry), fEvents(std::move(events)) {}

void TWatchedRegistry::RegisterNamespaceProvider(boost::shared_ptr<INamespaceProvider> provider) {
  fEvents.fBegins();
  std::string const name = provider->GetName(TCIMContext());  // for an empty pointer, a failed assertion
  if (Has(name)) return fEvents.fIsTaken(name);
  fRegistry->RegisterNamespaceProvider(provider);
  fNew[name] = provider;
  fEvents.fEnds(name);
}

boost::shared_ptr<INamespaceProvider> TWatchedRegistry::GetNamespaceProvider(std::string const& name) const {
  return fRegistry->GetNamespaceProvider(name);
}

void TWatchedRegistry::EnumerateNamespaceProviders(boost::function<bool(boost::shared_ptr<INamespaceProvider>)> callback) {
  fRegistry->EnumerateNamespaceProviders(callback);
}

std::vector<boost::shared_ptr<INamespaceProvider>> TWatchedRegistry::NewProviders() const {
  std::vector<boost::shared_ptr<INamespaceProvider>> providers;
  for (auto const& [name, provider] : fNew) providers.push_back(provider);
  return providers;
}

bool TWatchedRegistry::Has(std::string const& name) const {
  bool isTaken = false;
  fRegistry->EnumerateNamespaceProviders([&](boost::shared_ptr<INamespaceProvider> provider) {
    isTaken = provider->GetName(TCIMContext()) == name;
    return !isTaken;
  });
  return isTaken;
}

}  // namespace NQRVZEP20
