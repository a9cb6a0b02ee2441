// SPDX-License-Identifier: Apache-2.0
#include "collect/process/TWatchedRegistry.h"

#include "TZEPFailure.h"

namespace NQRVZEP20 {

TWatchedRegistry::TWatchedRegistry(boost::shared_ptr<TNamespaceProviderManager> registry, TEvents events)
    : fRegistry(registry), fEvents(std::move(events)) {
  fRegistry->EnumerateNamespaceProviders([this](boost::shared_ptr<INamespaceProvider> provider) {
    fTaken.insert(provider->GetName(TCIMContext()));
    return true;
  });
}

void TWatchedRegistry::RegisterNamespaceProvider(boost::shared_ptr<INamespaceProvider> provider) {
  fEvents.fBegins();
  if (!provider) throw TZEPFailure(kZEPStatusFail, "it registers an empty pointer");
  std::string const name = provider->GetName(TCIMContext());
  if (fTaken.count(name) != 0) return fEvents.fIsTaken(name);
  fRegistry->RegisterNamespaceProvider(provider);
  fTaken.insert(name);
  fNew[name] = provider;
  fEvents.fEnds(name);
}

boost::shared_ptr<INamespaceProvider> TWatchedRegistry::GetNamespaceProvider(std::string const& name) const {
  return fRegistry->GetNamespaceProvider(name);
}

void TWatchedRegistry::EnumerateNamespaceProviders(boost::function<bool(boost::shared_ptr<INamespaceProvider>)> callback) {
  fRegistry->EnumerateNamespaceProviders(callback);
}

}  // namespace NQRVZEP20
