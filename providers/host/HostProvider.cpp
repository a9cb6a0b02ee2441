// SPDX-License-Identifier: Apache-2.0

// The provider plug-in. Loading libHost.nsp.so registers the provider "Host", whose namespace is filled when it is first
// asked for.

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
