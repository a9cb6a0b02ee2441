// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "collect/TNamespaceView.h"
#include "tools/zep/output/Json.h"
#include "tools/zep/processes/TChildProcess.h"

#include <chrono>
#include <memory>
#include <string>

namespace NQRVZEP20::zep {

// The namespace that the provider Controller (libController.nsp.so) filled from a remote controller.
struct TInventory {
  std::shared_ptr<TNamespaceView const> fView;  // null without an inventory
  std::string fWhyNotAll;                       // why there is none, or which lists are incomplete; empty if nothing is missing
};

// How an inventory is read.
struct TInventoryLimits {
  // The limits after a part of the time is over; at least a second remains.
  TInventoryLimits After(std::chrono::steady_clock::duration passed) const;

  unsigned fSeconds;    // after which no further command is sent
  bool fShowsProgress;  // on standard error, which must be a terminal
};

// Loads the provider into this process, which must have a session with the controller of the host (ControllerSession.h), and
// sends what it found. Call it in a child process.
void SendInventory(std::string const& host, TInventoryLimits const& limits, TSend const& send);

// Parses the data that SendInventory sent.
TInventory InventoryFrom(std::string sent);

// Adds the findings and all instances to a document.
void AddInventory(TJson& document, TInventory const& inventory);

// The findings, and a table for each subject.
std::string InventoryAsText(TInventory const& inventory);

}  // namespace NQRVZEP20::zep
