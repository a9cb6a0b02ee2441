// SPDX-License-Identifier: Apache-2.0

// The provider plug-in. Loading libDevices.nsp.so registers the provider "Devices", whose namespace is filled at the first call
// of GetNamespace.

#include "DevicesNamespace.h"
#include "TNamespaceProviderManager.h"
#include "providers/memory/TMemoryProvider.h"
#include "providers/reasons/TMachineFiles.h"

#include <boost/make_shared.hpp>

namespace NQRVZEP20 {

namespace {

void Fill(TMemoryNamespace& ns) {
  if (!IsSampleDescribed()) FillDevicesNamespace(TMachineFiles::OfThisProcess(), ns);
}

struct TRegistration {
  TRegistration() {
    TNamespaceProviderManager::GetInstance()->RegisterNamespaceProvider(
        boost::make_shared<TMemoryProvider>("Devices", "root/zep/devices", Fill));
  }
} const gRegistration;

}  // namespace

}  // namespace NQRVZEP20
