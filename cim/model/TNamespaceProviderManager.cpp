// SPDX-License-Identifier: Apache-2.0
#include "TNamespaceProviderManager.h"

#include "core/Failure.h"

#include <boost/make_shared.hpp>

namespace NQRVZEP20 {

boost::shared_ptr<TNamespaceProviderManager> TNamespaceProviderManager::fgInstance;

namespace {

// Creates the registry when the library is loaded, before any plug-in can register and before there is a second thread.
bool ManagerInit() {
  TNamespaceProviderManager::GetInstance();
  return true;
}

[[maybe_unused]] bool const gManagerIsMade = ManagerInit();

}  // namespace

boost::shared_ptr<TNamespaceProviderManager> TNamespaceProviderManager::GetInstance() {
  if (!fgInstance) fgInstance = boost::make_shared<TNamespaceProviderManager>();
  return fgInstance;
}

TNamespaceProviderManager::~TNamespaceProviderManager() = default;

void TNamespaceProviderManager::RegisterNamespaceProvider(boost::shared_ptr<INamespaceProvider> provider) {
  std::string const& name = provider->GetName(TCIMContext());
  fProviders.emplace(name, provider);  // the first provider of a name stays; others are dropped silently. Kept.
}

boost::shared_ptr<INamespaceProvider> TNamespaceProviderManager::GetNamespaceProvider(std::string const& name) const {
  auto const found = fProviders.find(name);
  if (found == fProviders.end()) LogErrorAndThrow(kZEPStatusNotFound, "", "Failed to find nsp named " + name);
  return found->second;
}

void TNamespaceProviderManager::EnumerateNamespaceProviders(
    boost::function<bool(boost::shared_ptr<INamespaceProvider>)> callback) {
  for (auto const& [name, provider] : fProviders)
    if (!callback(provider)) return;
}

}  // namespace NQRVZEP20
