#pragma once

#include "ICIMNamespace.h"

namespace NQRVZEP20 {

// A provider plug-in's entry object. The plug-in makes one when it is loaded and registers it with
// TNamespaceProviderManager, which files it under its name and keeps it to the end of the process.
class ZEP_EXPORT INamespaceProvider {
public:
  virtual ~INamespaceProvider();

  // The name that the provider is filed under. Asked for once, at registration, with an empty context.
  virtual std::string const& GetName(TCIMContext const& context) const = 0;

  // The namespace that the provider owns; the same one at each call. The first call may take as long as collecting the
  // data takes. Empty where the provider owns none that others may see.
  virtual boost::shared_ptr<ICIMNamespace> GetNamespace(TCIMContext const& /*context*/) { return {}; }
};

}  // namespace NQRVZEP20
