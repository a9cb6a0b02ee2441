// The provider plug-in: libHost.nsp.so registers its provider when it is loaded.

#include "HostNamespace.h"
#include "INamespaceProvider.h"
#include "TNamespaceProviderManager.h"

#include <boost/make_shared.hpp>

namespace NQRVZEP20 {

namespace {

// Describes the machine that the process runs on. The first GetNamespace reads the machine; later ones answer from memory.
class THostProvider : public INamespaceProvider {
public:
  std::string const& GetName(TCIMContext const&) const override { return fName; }

  boost::shared_ptr<ICIMNamespace> GetNamespace(TCIMContext const&) override {
    if (!fNamespace) fNamespace = MakeHostNamespace();
    return fNamespace;
  }

private:
  std::string const fName = "Host";
  boost::shared_ptr<ICIMNamespace> fNamespace;  // empty until it is asked for
};

struct TRegistration {
  TRegistration() { TNamespaceProviderManager::GetInstance()->RegisterNamespaceProvider(boost::make_shared<THostProvider>()); }
} const gRegistration;

}  // namespace

}  // namespace NQRVZEP20
