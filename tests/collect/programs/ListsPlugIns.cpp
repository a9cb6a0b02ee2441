// SPDX-License-Identifier: Apache-2.0

// Loads the plug-ins, and prints a line for each plug-in and each provider: its failure, or the namespace that it filled.

#include "collect/PlugIns.h"

#include <iostream>

using namespace NQRVZEP20;

int main() {
  for (TPlugIn const& plugIn : LoadPlugIns()) {
    std::cout << "plug-in " << plugIn.fName << ": " << plugIn.fError << "\n";
    for (TProviderRun const& run : plugIn.fProviders)
      std::cout << "provider " << run.fName << ": " << (run.fView ? "filled " + run.fView->GetName() : run.fError) << "\n";
  }
}
