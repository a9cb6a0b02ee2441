// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "collect/redaction/TPseudonyms.h"
#include "tools/zep/transfer/TLockFile.h"

#include <string>

namespace NQRVZEP20::zep {

// The file of the map between secrets and their pseudonyms, a JSON document that only its owner can read.

// The map that is used without --redaction-map: $XDG_STATE_HOME/zep/redaction-map.json, or below ~/.local/state if that variable
// is not set. Throws TWrongUsage if HOME is not set either.
std::string UsualRedactionMap();

// Reads a map of at most 16 MiB. Throws TFailure with kExitNoInput, and with the name of the file and the place, if it cannot be
// read, belongs to another user or is accessible to others, is cut or altered, or is not a map.
TPseudonyms ReadRedactionMap(std::string const& file);

// A map that is used for redacting: it is read if it exists, and written with Save. While an object exists, other processes
// cannot use the file in the same way.
class TRedactionMap {
public:
  // Creates the directory of the usual map, but no other. Throws like ReadRedactionMap, and TFailure with kExitNotWritten if the
  // file is in use.
  explicit TRedactionMap(std::string const& file);

  TPseudonyms& Pseudonyms() { return fPseudonyms; }

  // Throws like WriteOutputFile, also if the map has become longer than ReadRedactionMap reads.
  void Save() const;

private:
  std::string fFile;
  TLockFile fLock;
  TPseudonyms fPseudonyms;
};

}  // namespace NQRVZEP20::zep
