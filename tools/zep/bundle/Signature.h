// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "tools/zep/packing/Signature.h"

#include <memory>
#include <string>

namespace NQRVZEP20::zep {

// Signers and verifiers from files in PEM, of at most 1 MiB each.

// Reads the key, and the certificate that belongs to it from the same file or from `certificateFile`; further certificates in
// that file are added to each signature. Prints a warning if every user may read the key. Throws TFailure with kExitNoInput if a
// file cannot be read, and like NewSigner.
std::unique_ptr<TSigner> SignerFrom(std::string const& keyFile, std::string const& certificateFile);

// Whose signatures are trusted; at most one file is named.
struct TTrust {
  std::string fSignerFile;       // only the signer with this certificate
  std::string fAuthoritiesFile;  // signers whose certificates lead to one of these

  bool IsWanted() const { return !fSignerFile.empty() || !fAuthoritiesFile.empty(); }
};

// Reads the certificates. Throws TFailure with kExitNoInput if that fails.
std::unique_ptr<TVerifier> VerifierFor(TTrust const& trust);

}  // namespace NQRVZEP20::zep
