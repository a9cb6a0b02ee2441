// SPDX-License-Identifier: Apache-2.0

// Prints the machine type and model of this machine, as the host provider describes it.

#include <zepcore.h>

#include <iostream>

using namespace NQRVZEP20;

int main() {
  try {
    TOSSpecific::LoadNSPLibrary("Host");
    auto const provider = TRootObject::GetNamespaceProviderManager()->GetNamespaceProvider("Host");
    std::cout << TCIMSchemaHelper::GetMTM(provider->GetNamespace(TCIMContext())) << "\n";
  } catch (TZEPException const& failure) {
    std::cerr << failure.what() << "\n";  // such as kZEPStatusInvalidFormat: the product name has no machine type
    return 1;
  }
}
