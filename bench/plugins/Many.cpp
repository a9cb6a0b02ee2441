// SPDX-License-Identifier: Apache-2.0

// A provider plug-in with 100,000 instances of ten properties.

#include "TNamespaceProviderManager.h"
#include "providers/memory/TMemoryNamespace.h"
#include "providers/memory/TMemoryProvider.h"

#include <boost/make_shared.hpp>

#include <string>

namespace {

using namespace NQRVZEP20;

void Fill(TMemoryNamespace& ns) {
  ns.DefineClass("X_Item")
      .Key("Id", "uint32")
      .Property("Name", "string")
      .Property("Description", "string")
      .Property("Bytes", "uint64")
      .Property("Kind", "uint16")
      .Property("Load", "real64")
      .Property("IsReady", "boolean")
      .Property("When", "datetime")
      .Property("Offsets", "sint32[]")
      .Property("Missing", "string");
  TCIMDateTime const when("20070315143000.000000+060");
  TCIMValue const offsets(TCIMValue::TCIMType::kCIMTypeSint32, 0, {1, 2, 3});
  for (unsigned int n = 0; n < 100000; ++n)
    ns.AddInstance("X_Item", {{"Id", n},
                              {"Name", "item " + std::to_string(n)},
                              {"Description", "an item of medium length, such as a provider describes"},
                              {"Bytes", 1000ul * n},
                              {"Kind", 7},
                              {"Load", n / 3.0},
                              {"IsReady", n % 2 == 0},
                              {"When", when},
                              {"Offsets", offsets}});
}

struct TRegistration {
  TRegistration() {
    TNamespaceProviderManager::GetInstance()->RegisterNamespaceProvider(
        boost::make_shared<TMemoryProvider>("Many", "root/many", Fill));
  }
} const gRegistration;

}  // namespace
