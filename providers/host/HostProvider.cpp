// SPDX-License-Identifier: Apache-2.0

// The provider plug-in. Loading libHost.nsp.so registers the provider "Host", whose namespace is filled at the first call of
// GetNamespace.

#include "HostNamespace.h"
#include "TNamespaceProviderManager.h"
#include "providers/memory/TMemoryProvider.h"

#include <boost/make_shared.hpp>

namespace NQRVZEP20 {

namespace {

struct TRegistration {
  TRegistration() {
    TNamespaceProviderManager::GetInstance()->RegisterNamespaceProvider(
        boost::make_shared<TMemoryProvider>("Host", "root/zep/host", FillHostNamespace));
  }
} const gRegistration;

}  // namespace

}  // namespace NQRVZEP20
