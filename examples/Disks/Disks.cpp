// SPDX-License-Identifier: Apache-2.0

// A provider plug-in whose classes come from a schema in MOF.

#include "Mof.h"
#include "TMemoryNamespace.h"
#include "TMemoryProvider.h"
#include "TOSSpecific.h"
#include "TRootObject.h"

#include <boost/make_shared.hpp>

using namespace NQRVZEP20;

namespace {

void FillNamespace(TMemoryNamespace& ns) {
  ReadMofFile(TOSSpecific::GetZEPRootPath() + "/disks.mof", ns.shared_from_this());
  ns.AddInstance("X_Disk", {{"Name", "sda"}, {"State", 5}});
}

struct TRegistration {
  TRegistration() {
    TRootObject::GetNamespaceProviderManager()->RegisterNamespaceProvider(
        boost::make_shared<TMemoryProvider>("Disks", "root/disks", FillNamespace));
  }
} const gRegistration;

}  // namespace
