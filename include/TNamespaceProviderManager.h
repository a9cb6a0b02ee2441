// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "INamespaceProviderManager.h"

#include <map>

namespace NQRVZEP20 {

// The provider registry of the process. It is created when the library is loaded; the registry and its providers live until
// the process ends.
class ZEP_EXPORT TNamespaceProviderManager : public INamespaceProviderManager {
public:
  static boost::shared_ptr<TNamespaceProviderManager> GetInstance();

  ~TNamespaceProviderManager() override;

  void RegisterNamespaceProvider(boost::shared_ptr<INamespaceProvider> provider) override;
  boost::shared_ptr<INamespaceProvider> GetNamespaceProvider(std::string const& name) const override;
  void EnumerateNamespaceProviders(boost::function<bool(boost::shared_ptr<INamespaceProvider>)> callback) override;

  static boost::shared_ptr<TNamespaceProviderManager> fgInstance;  // set when the library is loaded

private:
  std::map<std::string, boost::shared_ptr<INamespaceProvider>> fProviders;  // by name, in byte order
};

}  // namespace NQRVZEP20
