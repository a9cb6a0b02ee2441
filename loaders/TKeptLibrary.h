// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "core/TNeverDestroyed.h"
#include "loaders/TLoadedLibrary.h"

#include <memory>
#include <mutex>

namespace NQRVZEP20 {

// A library that is opened on first use and then stays loaded until the process ends. While it cannot be opened, each use tries
// again. Thread-safe.
template <class TFunctions>
class TKeptLibrary {
public:
  using TLibrary = TLoadedLibrary<TFunctions>;

  // Never null: if the library cannot be opened, the outcome contains the reason.
  static std::shared_ptr<TLibrary const> Get() {
    static TNeverDestroyed<TKeptLibrary> kept;
    std::lock_guard<std::mutex> const lock(kept->fMutex);
    if (kept->fLibrary) return kept->fLibrary;
    auto const opened = std::make_shared<TLibrary const>();
    if (opened->Outcome()) kept->fLibrary = opened;
    return opened;
  }

private:
  std::mutex fMutex;
  std::shared_ptr<TLibrary const> fLibrary;  // null until it has been opened
};

}  // namespace NQRVZEP20
