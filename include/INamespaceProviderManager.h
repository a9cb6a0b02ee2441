#pragma once

#include "INamespaceProvider.h"

namespace NQRVZEP20 {

// The registry of namespace providers, as a host sees it; TRootObject::GetNamespaceProviderManager() hands it out.
//
// No lock: providers register while plug-ins load, before the registry is used from several threads.
class ZEP_EXPORT INamespaceProviderManager {
public:
  virtual ~INamespaceProviderManager();

  // Files the provider under the name that it reports. The first provider of a name stays: a second one is dropped
  // without a word. Names are raw bytes; case matters. An empty pointer is a failed assertion.
  virtual void RegisterNamespaceProvider(boost::shared_ptr<INamespaceProvider> provider) = 0;

  // Throws kZEPStatusNotFound, after an error in the log, when no provider has that name.
  virtual boost::shared_ptr<INamespaceProvider> GetNamespaceProvider(std::string const& name) const = 0;

  // In byte order of the names, until a call returns false.
  virtual void EnumerateNamespaceProviders(boost::function<bool(boost::shared_ptr<INamespaceProvider>)> callback) = 0;
};

}  // namespace NQRVZEP20
