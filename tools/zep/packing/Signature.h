// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <memory>
#include <stdexcept>
#include <string>
#include <string_view>

namespace NQRVZEP20::zep {

// Detached signatures of texts, by OpenSSL's CMS.

// A file in PEM: its name, for messages, and its contents.
struct TPem {
  std::string fFile;
  std::string_view fText;
};

// Signs with a private key, which the destructor overwrites in memory.
class TSigner {
public:
  virtual ~TSigner() = default;

  // The signature in DER, with the certificates. Throws std::runtime_error if OpenSSL fails.
  virtual std::string Sign(std::string const& text) const = 0;
};

// Why a signature is refused: a clause about "it", the signature.
struct TSignatureError : std::runtime_error {
  using std::runtime_error::runtime_error;
};

class TVerifier {
public:
  virtual ~TVerifier() = default;

  // Returns the subject of the signer's certificate, "CN=db1,O=Example"; of several signers, each. With certificates that are
  // trusted, the signer is one of theirs, and each certificate in the chain is valid now. Without them the certificate is not
  // checked: anyone can make one with any subject. Throws TSignatureError if the signature is refused.
  virtual std::string Verify(std::string const& text, std::string const& signature) const = 0;
};

// The first certificate is that of the key; the others are added to each signature. Throws TFailure with kExitNoInput if a text
// has no key or no certificate, the key has a passphrase or cannot sign (only RSA and ECDSA keys can), or the certificate belongs
// to another key, is not valid now or is not for signatures.
std::unique_ptr<TSigner> NewSigner(TPem const& key, TPem const& certificates);

// Whose signatures a verifier trusts.
enum class ETrusted {
  kAnyone,      // no certificate is checked
  kSigner,      // only the signer with the certificate
  kAuthorities  // signers whose certificates lead to one of those given
};

// Throws TFailure with kExitNoInput if the text has no certificate, or more than the one of kSigner. For kAnyone it is not read.
std::unique_ptr<TVerifier> NewVerifier(ETrusted trusted, TPem const& certificates);

}  // namespace NQRVZEP20::zep
