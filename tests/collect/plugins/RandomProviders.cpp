// SPDX-License-Identifier: Apache-2.0

// A plug-in whose providers have namespaces of random classes and values: provider "Random7" that of RandomNamespace(7).

#include "TNamespaceProviderManager.h"
#include "tests/collect/answer/RandomNamespace.h"

#include <boost/make_shared.hpp>

#include <string>

namespace NQRVZEP20 {
namespace {

class TRandomProvider : public INamespaceProvider {
public:
  explicit TRandomProvider(unsigned int seed) : fName("Random" + std::to_string(seed)), fSeed(seed) {}

  std::string const& GetName(TCIMContext const&) const override { return fName; }

  boost::shared_ptr<ICIMNamespace> GetNamespace(TCIMContext const&) override {
    if (!fNamespace) fNamespace = RandomNamespace(fSeed);
    return fNamespace;
  }

private:
  std::string const fName;
  unsigned int const fSeed;
  boost::shared_ptr<ICIMNamespace> fNamespace;
};

struct TRegistration {
  TRegistration() {
    for (unsigned int seed = 0; seed < kRandomProviders; ++seed)
      TNamespaceProviderManager::GetInstance()->RegisterNamespaceProvider(boost::make_shared<TRandomProvider>(seed));
  }
} const gRegistration;

}  // namespace
}  // namespace NQRVZEP20
