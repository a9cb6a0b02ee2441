// SPDX-License-Identifier: Apache-2.0

// The provider plug-in. Loading libStorage.nsp.so registers the provider "Storage", whose namespace is filled at the first call
// of GetNamespace.

#include "StorageNamespace.h"
#include "TNamespaceProviderManager.h"
#include "providers/memory/TMemoryProvider.h"
#include "providers/reasons/TMachineFiles.h"

#include <boost/make_shared.hpp>

namespace NQRVZEP20 {

namespace {

void Fill(TMemoryNamespace& ns) {
  if (!IsSampleDescribed()) FillStorageNamespace(ns, TMachineFiles::OfThisProcess());
}

struct TRegistration {
  TRegistration() {
    TNamespaceProviderManager::GetInstance()->RegisterNamespaceProvider(
        boost::make_shared<TMemoryProvider>("Storage", "root/zep/storage", Fill));
  }
} const gRegistration;

}  // namespace

}  // namespace NQRVZEP20
