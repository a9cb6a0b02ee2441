// SPDX-License-Identifier: Apache-2.0
#include "loaders/UsbLan.h"

#include "core/Log.h"
#include "loaders/TLoadedLibrary.h"
#include "platform/include/usblan.h"

namespace NQRVZEP20 {
namespace {

struct TUsbLanFunctions {
  decltype(GetNodes)* fGetNodes = nullptr;
  decltype(BringupOvdLan)* fBringUp = nullptr;
  decltype(QueryOvdLanState)* fQueryState = nullptr;

  static TLibraryPlace Place() { return {{"./ovdusblan.so"}, RTLD_LAZY}; }
  std::vector<TLibraryFunction> Table() {
    return {{"GetNodes", fGetNodes}, {"BringupOvdLan", fBringUp}, {"QueryOvdLanState", fQueryState}};
  }
};

}  // namespace

bool BringUpUsbLan() {
  TLoadedLibrary<TUsbLanFunctions> const usbLan;
  if (!usbLan.Outcome()) return false;

  constexpr int kIsUp = 1;
  try {
    int const nodes = usbLan->fGetNodes();
    for (int node = 0; node < nodes; ++node)
      if (usbLan->fQueryState(node) != kIsUp) usbLan->fBringUp(node);
    return true;
  } catch (...) {
    LogDebug("USB over Lan Bring up fail. \n");
    return false;
  }
}

}  // namespace NQRVZEP20
