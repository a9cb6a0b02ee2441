// SPDX-License-Identifier: Apache-2.0

// The provider plug-in. Loading libNetwork.nsp.so registers the provider "Network", whose namespace is filled at the first call
// of GetNamespace.

#include "NetworkNamespace.h"
#include "TNamespaceProviderManager.h"
#include "providers/memory/TMemoryProvider.h"

#include <boost/make_shared.hpp>

namespace NQRVZEP20 {

namespace {

struct TRegistration {
  TRegistration() {
    auto const fill = [](TMemoryNamespace& ns) {
      if (!IsSampleDescribed()) FillNetworkNamespace(ns, TMachineFiles::OfThisProcess());
    };
    TNamespaceProviderManager::GetInstance()->RegisterNamespaceProvider(
        boost::make_shared<TMemoryProvider>("Network", "root/zep/network", fill));
  }
} const gRegistration;

}  // namespace

}  // namespace NQRVZEP20
