// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "tools/zep/bundle/BundleManifest.h"
#include "tools/zep/bundle/Signature.h"

#include <string>
#include <vector>

namespace NQRVZEP20::zep {

// Where a bundle is not as its manifest says, or its signature is not as demanded.
struct TBundleDifference {
  std::string fMember;  // its name in the archive, which may be any text
  std::string fReason;  // a clause: "its SHA-256 differs"
};

struct TBundleCheck {
  TBundleManifest fManifest;
  std::vector<TBundleDifference> fDifferences;  // the missing members last
  std::string fSigner;                          // the subject of the certificate; empty without a valid signature

  bool IsRight() const { return fDifferences.empty(); }
};

// Compares the members of a bundle with its manifest: names, kinds, sizes and checksums; and the signature with the manifest. A
// bundle without a signature is a difference if a signer is to be trusted. Reads the file once, and holds only manifest and
// signature in memory; nothing is written. Throws TArchiveError if the file is not a bundle, is cut, of a newer version, or
// longer than the limits allow; and TFailure with kExitNoInput if the certificates in `trust` cannot be read.
TBundleCheck CheckBundle(std::string const& file, TTrust const& trust);

}  // namespace NQRVZEP20::zep
