// SPDX-License-Identifier: Apache-2.0

// Prints the directory of the library, the host provider's class of the system, the exception for an empty
// pointer, and the reason that a failure carries.

#include <zepcore.h>

#include <iostream>

using namespace NQRVZEP20;

int main() {
  std::cout << TOSSpecific::GetZEPRootPath() << "\n";
  TOSSpecific::LoadNSPLibrary("Host");
  boost::shared_ptr<ICIMNamespace> const ns =
      TRootObject::GetNamespaceProviderManager()->GetNamespaceProvider("Host")->GetNamespace(TCIMContext());
  std::cout << ns->GetClass("QRVSG_ComputerSystem", TCIMContext())->GetName(TCIMContext()) << "\n";
  try {
    boost::shared_ptr<ICIMNamespace> nothing(ns);
    nothing.reset();
    nothing->GetName(TCIMContext());
  } catch (TZEPException const& thrown) {
    std::cout << thrown.what() << "\n";
  }
  try {
    TRootObject::GetNamespaceProviderManager()->GetNamespaceProvider("Nothing");
  } catch (TZEPFailure const& thrown) {
    std::cout << thrown.what() << ": " << thrown.Reason() << "\n";
  }
}
