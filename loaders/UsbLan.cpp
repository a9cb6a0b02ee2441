// SPDX-License-Identifier: Apache-2.0
#include "loaders/UsbLan.h"

#include "core/Handles.h"
#include "core/Log.h"
#include "platform/include/usblan.h"

namespace NQRVZEP20 {

bool BringUpUsbLan() {
  TSharedLibrary const library(::dlopen("./ovdusblan.so", RTLD_LAZY));
  if (!library) return false;
  auto* const getNodes = FunctionOf<decltype(GetNodes)>(library.get(), "GetNodes");
  auto* const bringUp = FunctionOf<decltype(BringupOvdLan)>(library.get(), "BringupOvdLan");
  auto* const queryState = FunctionOf<decltype(QueryOvdLanState)>(library.get(), "QueryOvdLanState");
  if (!getNodes || !bringUp || !queryState) return false;

  constexpr int kIsUp = 1;
  try {
    int const nodes = getNodes();
    for (int node = 0; node < nodes; ++node)
      if (queryState(node) != kIsUp) bringUp(node);
    return true;
  } catch (...) {
    LogDebug("USB over Lan Bring up fail. \n");
    return false;
  }
}

}  // namespace NQRVZEP20
