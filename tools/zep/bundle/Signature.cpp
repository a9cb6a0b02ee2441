// SPDX-License-Identifier: Apache-2.0
#include "tools/zep/bundle/Signature.h"

#include "tools/zep/output/Failure.h"
#include "tools/zep/secrets/PrivateFile.h"

namespace NQRVZEP20::zep {

namespace {

TPrivateFile Contents(std::string const& file, std::string const& option) {
  TPrivateFile contents(file);
  if (contents.Error() != 0)
    throw TFailure(kExitNoInput, NameOfPrivateFile(file, option) + " cannot be read: " + contents.Reason());
  return contents;
}

}  // namespace

std::unique_ptr<TSigner> SignerFrom(std::string const& keyFile, std::string const& certificateFile) {
  TPrivateFile const key = Contents(keyFile, "--sign");
  key.WarnWhenOthersMayRead("the private key");
  TPem const keyPem{keyFile, key.Text()};
  if (certificateFile.empty()) return NewSigner(keyPem, keyPem);
  TPrivateFile const certificates = Contents(certificateFile, "--certificate");
  return NewSigner(keyPem, {certificateFile, certificates.Text()});
}

std::unique_ptr<TVerifier> VerifierFor(TTrust const& trust) {
  if (!trust.IsWanted()) return NewVerifier(ETrusted::kAnyone, {});
  bool const isSigner = !trust.fSignerFile.empty();
  std::string const& file = isSigner ? trust.fSignerFile : trust.fAuthoritiesFile;
  TPrivateFile const certificates = Contents(file, isSigner ? "--signer" : "--ca");
  return NewVerifier(isSigner ? ETrusted::kSigner : ETrusted::kAuthorities, {file, certificates.Text()});
}

}  // namespace NQRVZEP20::zep
