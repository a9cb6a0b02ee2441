// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "tools/zep/bundle/BundleManifest.h"
#include "tools/zep/bundle/Signature.h"

#include <string>
#include <vector>

namespace NQRVZEP20::zep {

// A bundle in memory, which is packed piece by piece.
class TBundle {
public:
  // `redacted`: the kinds of secrets that are replaced in all pieces (TBundleManifest).
  explicit TBundle(std::vector<std::string> redacted);

  // Adds a piece, in the order of the pieces (BundleManifest.h). One that is longer than MostBytesOf is missing instead.
  void Add(std::string const& piece, std::string content, std::string const& obtained);

  void AddMissing(std::string const& piece, std::string const& reason) { fManifest.fMissing.push_back({piece, reason}); }

  TBundleManifest const& Manifest() const { return fManifest; }

  // The archive; signed if `signer` is not null. Call it once, at the end. Throws std::runtime_error if a library fails.
  std::string Pack(TSigner const* signer);

private:
  TBundleManifest fManifest;
  std::vector<std::string> fContents;  // of the pieces of the manifest
};

}  // namespace NQRVZEP20::zep
