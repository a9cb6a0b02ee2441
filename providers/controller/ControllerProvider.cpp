// SPDX-License-Identifier: Apache-2.0

// The provider plug-in. Loading libController.nsp.so registers the provider "Controller", whose namespace is filled at the first
// call of GetNamespace: from the controller of this machine, or from the one in its context (controllerPlugIn.h).

#include "Connections.h"
#include "ControllerNamespace.h"
#include "TNamespaceProviderManager.h"
#include "TSdrCacheFile.h"
#include "platform/include/controllerPlugIn.h"
#include "providers/memory/TMemoryProvider.h"

#include <boost/make_shared.hpp>

namespace NQRVZEP20 {

namespace {

constexpr std::chrono::seconds kLocalLimit{30};

TZepController const* gRemote = nullptr;

TIpmi Connection() {
  if (gRemote != nullptr) return WithinTime(SessionConnection(*gRemote), std::chrono::milliseconds(gRemote->fMilliseconds));
  TMachineFiles const files = TMachineFiles::OfThisProcess();
  if (!files.IsThisMachine()) return Recorded(TIpmi(), files);
  return Recorded(WithinTime(InThreads(LocalConnection(), kLocalLimit), kLocalLimit), files);
}

// No cache while answers are recorded or read from a recording, because a recording has all of them.
std::unique_ptr<ISdrCache> MakeCache(std::string const& identity) {
  TMachineFiles const files = TMachineFiles::OfThisProcess();
  bool const isRecorded = !files.IsThisMachine() || files.IsBeingRecorded() || std::getenv("ZEP_RECORD_ANSWERS") != nullptr;
  if (gRemote == nullptr && isRecorded) return nullptr;
  return std::make_unique<TSdrCacheFile>(gRemote != nullptr ? gRemote->fName : "this-machine", identity);
}

void NoteProgress(char const* step, std::size_t done, std::size_t all) {
  if (gRemote != nullptr && gRemote->fProgress != nullptr) gRemote->fProgress(step, done, all);
}

void Fill(TMemoryNamespace& ns) {
  if (IsSampleDescribed() && gRemote == nullptr) return;
  FillControllerNamespace(ReadController(Connection(), MakeCache, NoteProgress), TMachineFiles::OfThisProcess(), ns);
}

class TControllerProvider : public TMemoryProvider {
public:
  TControllerProvider() : TMemoryProvider("Controller", "root/zep/controller", Fill) {}

  boost::shared_ptr<ICIMNamespace> GetNamespace(TCIMContext const& context) override {
    auto const entry = context.find(kZepControllerEntry);
    if (entry != context.end()) {
      unsigned long const address = entry->second;
      gRemote = reinterpret_cast<TZepController const*>(address);  // NOLINT(performance-no-int-to-ptr): a context has no pointers
    }
    return TMemoryProvider::GetNamespace(context);
  }
};

struct TRegistration {
  TRegistration() {
    TNamespaceProviderManager::GetInstance()->RegisterNamespaceProvider(boost::make_shared<TControllerProvider>());
  }
} const gRegistration;

}  // namespace

}  // namespace NQRVZEP20
