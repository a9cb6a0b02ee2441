// SPDX-License-Identifier: Apache-2.0

// A provider plug-in: it registers itself when it is loaded.

#include "INamespaceProvider.h"
#include "TNamespaceProviderManager.h"

#include <boost/make_shared.hpp>

using namespace NQRVZEP20;

// Seen by what is loaded later only when this library is loaded so.
extern "C" ZEP_EXPORT int const gFanProviderMark = 1;

namespace {

class TFanProvider : public INamespaceProvider {
public:
  std::string const& GetName(TCIMContext const&) const override { return fName; }
  boost::shared_ptr<ICIMNamespace> GetNamespace(TCIMContext const&) override { return nullptr; }

private:
  std::string fName = "Fan";
};

bool Register() {
  TNamespaceProviderManager::GetInstance()->RegisterNamespaceProvider(boost::make_shared<TFanProvider>());
  return true;
}

[[maybe_unused]] bool const gIsRegistered = Register();

}  // namespace
