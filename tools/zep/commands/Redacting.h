// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "collect/redaction/ESecretKind.h"
#include "tools/zep/output/Json.h"

#include <string>
#include <vector>

namespace CLI {
class App;
}

namespace NQRVZEP20::zep {

struct TRedactionArguments {
  std::vector<ESecretKind> fKinds;  // empty: nothing is redacted
  std::string fMapFile;             // empty: the usual map (RedactionMap.h)

  bool IsWanted() const { return !fKinds.empty(); }
};

// Adds --redact and --redaction-map.
void AddRedactionOptions(CLI::App& command, TRedactionArguments& arguments);

// Redacts the complete document of a report, writes the map, and prints the name of its file to standard error. Throws TFailure
// with kExitNoInput if the map is refused or the document was redacted with another map, and like WriteOutputFile.
void RedactDocument(TJson& document, TRedactionArguments const& arguments);

// "31 serials, 4 hosts, 22 addresses and 1 user", and whether they are redacted: all of them, or which kinds.
std::string ContentsText(TSecretCounts const& counts, std::vector<ESecretKind> const& redacted);

}  // namespace NQRVZEP20::zep
