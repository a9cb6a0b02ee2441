// SPDX-License-Identifier: Apache-2.0

// Loads provider plug-ins by their paths and prints every instance that they provide:
//
//   ListProvider examples/libClock.nsp.so

#include <zepcore.h>

#include <iostream>

using namespace NQRVZEP20;

namespace {

TCIMContext const kNone;

bool PrintProperty(boost::shared_ptr<ICIMProperty> const& property) {
  TCIMValue const value = property->GetValue(kNone);
  std::cout << "    " << property->GetName(kNone) << " = " << (value.IsNull() ? "(none)" : value.ToString()) << "\n";
  return true;
}

bool PrintInstance(boost::shared_ptr<ICIMInstance> const& instance) {
  std::cout << "  " << instance->GetPath(kNone).GetPath() << "\n";
  instance->EnumerateProperties(PrintProperty, kNone);
  return true;
}

// A root class enumerates the instances of its subclasses too.
bool PrintProvider(boost::shared_ptr<INamespaceProvider> const& provider) {
  auto const ns = provider->GetNamespace(kNone);
  std::cout << provider->GetName(kNone) << ": " << ns->GetName(kNone) << "\n";
  ns->EnumerateClasses(
      [](boost::shared_ptr<ICIMClass> const& root) {
        root->EnumerateInstances(PrintInstance, kNone);
        return true;
      },
      kNone);
  return true;
}

}  // namespace

int main(int argc, char** argv) {
  try {
    for (int i = 1; i < argc; ++i) TOSSpecific::LoadPluginLibrary(argv[i]);
    TRootObject::GetNamespaceProviderManager()->EnumerateNamespaceProviders(PrintProvider);
    return 0;
  } catch (TZEPException const& failure) {
    std::cerr << failure.what() << "\n";
    return 1;
  }
}
