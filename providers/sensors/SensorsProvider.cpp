// SPDX-License-Identifier: Apache-2.0

// The provider plug-in. Loading libSensors.nsp.so registers the provider "Sensors", whose namespace is filled at the first call
// of GetNamespace.

#include "SensorsNamespace.h"
#include "TNamespaceProviderManager.h"
#include "providers/memory/TMemoryProvider.h"
#include "providers/reasons/TMachineFiles.h"

#include <boost/make_shared.hpp>

namespace NQRVZEP20 {

namespace {

void Fill(TMemoryNamespace& ns) {
  if (!IsSampleDescribed()) FillSensorsNamespace(TMachineFiles::OfThisProcess(), ns);
}

struct TRegistration {
  TRegistration() {
    TNamespaceProviderManager::GetInstance()->RegisterNamespaceProvider(
        boost::make_shared<TMemoryProvider>("Sensors", "root/zep/sensors", Fill));
  }
} const gRegistration;

}  // namespace

}  // namespace NQRVZEP20
