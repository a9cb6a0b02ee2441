// SPDX-License-Identifier: Apache-2.0

// A provider plug-in Controller of another version: it does not know the entry of the context that has the session.

#include "TNamespaceProviderManager.h"
#include "providers/memory/TMemoryNamespace.h"
#include "providers/memory/TMemoryProvider.h"

#include <boost/make_shared.hpp>

namespace NQRVZEP20 {

namespace {

struct TRegistration {
  TRegistration() {
    TNamespaceProviderManager::GetInstance()->RegisterNamespaceProvider(
        boost::make_shared<TMemoryProvider>("Controller", "root/zep/controller", [](TMemoryNamespace&) {}));
  }
} const gRegistration;

}  // namespace

}  // namespace NQRVZEP20
