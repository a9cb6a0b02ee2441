// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "collect/PlugIns.h"
#include "collect/TNamespaceView.h"
#include "tools/zep/commands/Providers.h"
#include "tools/zep/plugin/check/Content.h"

#include <optional>
#include <string>
#include <vector>

namespace NQRVZEP20::zep {

// A plug-in that was loaded, and filled its namespaces, in a process of its own.
struct TTrial {
  TPlugIn fPlugIn;
  std::vector<TContent> fContents;  // of the providers that filled their namespaces
};

// All that the rules of a check need to know about a plug-in.
struct TObservation {
  TPlugInFile fFile;
  std::optional<std::vector<std::string>> fExports;  // none if they cannot be read
  std::vector<std::string> fInstalled;               // the names of the other plug-ins that are installed
  TTrial fFirst;                                     // empty if the file is not loaded
  TTrial fSecond;                                    // empty if no namespace was filled in the first
  std::string fSchemaFile;                           // empty without a schema
  std::string fWhyNoSchema;                          // in that case
  std::optional<TNamespaceView> fSchema;

  // Why there is nothing to examine; empty otherwise.
  std::string WhyNotLoaded() const;  // no library
  std::string WhyNoContent() const;  // no namespace
};

// Loads the plug-in in two processes, one after the other and in different seconds of the clock, and reads the schema: `mofFile`,
// or if that is empty, the one that SchemaFile finds. Throws std::runtime_error for a file that does not exist, and TMofError for
// a wrong schema. Blocks like LoadPlugInsApart.
TObservation Observe(std::string const& file, std::string const& mofFile, TPlugInArguments const& arguments);

}  // namespace NQRVZEP20::zep
