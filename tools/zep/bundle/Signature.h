// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <memory>
#include <stdexcept>
#include <string>

namespace NQRVZEP20::zep {

// Detached signatures of texts, by OpenSSL's CMS. Keys and certificates are PEM files of at most 1 MiB.

// Signs with a private key. Move-only; the key is overwritten in memory by the destructor.
class TSigner {
public:
  // Reads the key, and the certificate that belongs to it from the same file or from `certificateFile`; further certificates in
  // that file are added to each signature. Prints a warning if every user may read the key. Throws TFailure with kExitNoInput if
  // a file cannot be read, the key has a passphrase or cannot sign, or the certificate belongs to another key or has expired.
  TSigner(std::string const& keyFile, std::string const& certificateFile);
  ~TSigner();
  TSigner(TSigner const&) = delete;
  TSigner& operator=(TSigner const&) = delete;

  // The signature in DER, with the certificates. Throws std::runtime_error if OpenSSL fails.
  std::string Sign(std::string const& text) const;

private:
  struct TParts;
  std::unique_ptr<TParts> fParts;
};

// Whose signatures are trusted; at most one file is named.
struct TTrust {
  std::string fSignerFile;       // only the signer with this certificate
  std::string fAuthoritiesFile;  // signers whose certificates lead to one of these

  bool IsWanted() const { return !fSignerFile.empty() || !fAuthoritiesFile.empty(); }
};

// Why a signature is refused: a clause about "it", the signature.
struct TSignatureError : std::runtime_error {
  using std::runtime_error::runtime_error;
};

class TVerifier {
public:
  // Reads the certificates. Throws TFailure with kExitNoInput if that fails.
  explicit TVerifier(TTrust const& trust);
  ~TVerifier();
  TVerifier(TVerifier const&) = delete;
  TVerifier& operator=(TVerifier const&) = delete;

  // Returns the subject of the signer's certificate, "CN=db1,O=Example"; of several signers, each. With certificates that are
  // trusted, the signer is one of theirs, and each certificate in the chain is valid now. Without them the certificate is not
  // checked: anyone can make one with any subject. Throws TSignatureError if the signature is refused.
  std::string Verify(std::string const& text, std::string const& signature) const;

private:
  struct TParts;
  std::unique_ptr<TParts> fParts;
};

}  // namespace NQRVZEP20::zep
