// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "collect/TNamespaceView.h"
#include "collect/findings/TThresholds.h"
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
  // The limits after a part of the time is over.
  TInventoryLimits After(std::chrono::steady_clock::duration passed) const;

  std::chrono::milliseconds fTime;  // after which no command is sent, and no answer is waited for
  bool fShowsProgress;              // on standard error, which must be a terminal
};

// Loads the provider into this process, which must have a session with the controller of the host (ControllerSession.h), and
// sends what it found. Call it in a child process. Returns false if a command was not answered in time: a thread still waits for
// its answer then, so that the session must not be used any more, not even to close it.
bool SendInventory(std::string const& host, TInventoryLimits const& limits, TSend const& send);

// Parses the data that SendInventory sent.
TInventory InventoryFrom(std::string sent);

// Adds the findings and all instances to a document.
void AddInventory(TJson& document, TInventory const& inventory, TThresholds const& thresholds);

// The findings, and a table for each subject.
std::string InventoryAsText(TInventory const& inventory, TThresholds const& thresholds);

}  // namespace NQRVZEP20::zep
