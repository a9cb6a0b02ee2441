// SPDX-License-Identifier: Apache-2.0
#include "tools/zep/bundle/Signature.h"

#include "tests/tools/zep/bundle/Certificates.h"
#include "tools/zep/output/Failure.h"

#include <gmock/gmock.h>
#include <openssl/cms.h>

#include <cstdlib>
#include <filesystem>

namespace NQRVZEP20::zep {
namespace {

using testing::HasSubstr;
using testing::StartsWith;

class SignatureTest : public testing::Test {
protected:
  std::string SignedBy(TIdentity const& signer, std::string const& text = "text") {
    return SignerFrom(signer.fKeyFile, signer.fCertificateFile)->Sign(text);
  }

  // Why the signature of "text" is refused; empty if it is not.
  static std::string WhyRefused(std::string const& signature, TTrust const& trust = {}, std::string const& text = "text") {
    try {
      VerifierFor(trust)->Verify(text, signature);
      return "";
    } catch (TSignatureError const& failure) {
      return failure.what();
    }
  }

  // Why no signer can be made of the files.
  static std::string WhyNoSigner(std::string const& key, std::string const& certificate = "") {
    try {
      SignerFrom(key, certificate);
      return "";
    } catch (TFailure const& failure) {
      EXPECT_EQ(failure.fStatus, kExitNoInput);
      return failure.what();
    }
  }

  static std::string WhyNoVerifier(TTrust const& trust) {
    try {
      VerifierFor(trust);
      return "";
    } catch (TFailure const& failure) {
      EXPECT_EQ(failure.fStatus, kExitNoInput);
      return failure.what();
    }
  }

  TTempDir fDir;
  TIdentity fCa{fDir, "ca", 100, nullptr, true}, fAlice{fDir, "alice", 100, &fCa}, fMallory{fDir, "mallory"};
};

TEST_F(SignatureTest, TheSignerIsNamedAndTrustedByCertificateOrAuthority) {
  std::string const signature = SignedBy(fAlice);
  EXPECT_EQ(VerifierFor({})->Verify("text", signature), "CN=alice");
  EXPECT_EQ(VerifierFor({fAlice.fCertificateFile, ""})->Verify("text", signature), "CN=alice");
  EXPECT_EQ(VerifierFor({"", fCa.fCertificateFile})->Verify("text", signature), "CN=alice");
  EXPECT_EQ(VerifierFor({"", fAlice.fCertificateFile})->Verify("text", signature), "CN=alice");
}

TEST_F(SignatureTest, AnotherSignerIsNotTrusted) {
  constexpr char const* other = "it is of another signer than the one that is trusted";
  std::string const signature = SignedBy(fMallory);
  EXPECT_EQ(WhyRefused(signature), "");
  EXPECT_EQ(WhyRefused(signature, {fAlice.fCertificateFile, ""}), other);
  EXPECT_EQ(WhyRefused(signature, {fCa.fCertificateFile, ""}), other);
  EXPECT_THAT(WhyRefused(signature, {"", fCa.fCertificateFile}), StartsWith("the certificate of its signer is not trusted ("));
}

// A certificate that the pinned one issued is another one.
TEST_F(SignatureTest, ASignerIsItsCertificateNotItsIssuer) {
  EXPECT_EQ(WhyRefused(SignedBy(fAlice), {fCa.fCertificateFile, ""}), "it is of another signer than the one that is trusted");
}

TEST_F(SignatureTest, AnotherTextIsRefused) {
  for (TTrust const& trust : {TTrust{}, TTrust{fAlice.fCertificateFile, ""}, TTrust{"", fCa.fCertificateFile}})
    EXPECT_THAT(WhyRefused(SignedBy(fAlice), trust, "text2"), StartsWith("it is not a signature of this manifest ("));
}

TEST_F(SignatureTest, ACertificateThatHasExpiredNeitherSignsNorIsTrusted) {
  TIdentity const old(fDir, "old", 0, &fCa);
  EXPECT_EQ(WhyNoSigner(old.fKeyFile, old.fCertificateFile), old.fCertificateFile + " has a certificate that has expired");
  WriteFile(fDir.Path("text"), "text");
  std::string const sign =
      "cd '" + fDir.Path() + "' && openssl cms -sign -binary -in text -signer old.pem -inkey old.key -outform DER -out old.p7s";
  ASSERT_EQ(std::system(sign.c_str()), 0);
  std::string const signature = ReadFile(fDir.Path("old.p7s"));
  EXPECT_EQ(WhyRefused(signature), "");
  EXPECT_THAT(WhyRefused(signature, {old.fCertificateFile, ""}), HasSubstr("certificate has expired"));
  EXPECT_THAT(WhyRefused(signature, {"", fCa.fCertificateFile}), HasSubstr("certificate has expired"));
}

// Its signature would be refused.
TEST_F(SignatureTest, ACertificateThatIsNotForSignaturesDoesNotSign) {
  struct {
    int fExtension;
    char const* fValue;
    bool fSigns;
  } const rows[] = {{NID_ext_key_usage, "serverAuth", false},
                    {NID_ext_key_usage, "serverAuth,emailProtection", true},
                    {NID_key_usage, "keyEncipherment", false},
                    {NID_key_usage, "digitalSignature", true}};
  for (auto const& row : rows) {
    TIdentity restricted(fDir, "restricted");
    restricted.RestrictTo(row.fExtension, row.fValue);
    std::string const why = WhyNoSigner(restricted.fKeyFile, restricted.fCertificateFile);
    EXPECT_EQ(why.empty(), row.fSigns) << row.fValue;
    if (row.fSigns)
      EXPECT_EQ(WhyRefused(SignedBy(restricted), {restricted.fCertificateFile, ""}), "");
    else
      EXPECT_THAT(why, StartsWith(restricted.fCertificateFile + " has a certificate that is not for signatures: "));
  }
}

TEST_F(SignatureTest, ACertificateThatIsNotValidYetDoesNotSign) {
  TIdentity early(fDir, "early");
  early.BeginTomorrow();
  EXPECT_EQ(WhyNoSigner(early.fKeyFile, early.fCertificateFile),
            early.fCertificateFile + " has a certificate that is not valid yet");
}

TEST_F(SignatureTest, AKeyOfAnotherKindIsRefusedWithTheKindsThatSign) {
  std::string const make = "cd '" + fDir.Path() +
                           "' && openssl req -x509 -newkey ed25519 -nodes -keyout ed.key -out ed.pem -subj /CN=ed -days 10 "
                           "2> errors";
  ASSERT_EQ(std::system(make.c_str()), 0) << ReadFile(fDir.Path("errors"));
  EXPECT_THAT(WhyNoSigner(fDir.Path("ed.key"), fDir.Path("ed.pem")),
              StartsWith(fDir.Path("ed.key") + " has a key that cannot sign; RSA and ECDSA keys can ("));
}

TEST_F(SignatureTest, BytesAfterASignatureAreRefused) {
  EXPECT_EQ(WhyRefused(SignedBy(fAlice) + "junk"), "it has bytes after its end");
}

TEST_F(SignatureTest, AnythingElseThanASignatureIsRefused) {
  std::string const good = SignedBy(fAlice);
  for (std::string const& bytes :
       {std::string(), std::string("text"), good.substr(0, good.size() / 2), ReadFile(fAlice.fKeyFile)})
    EXPECT_THAT(WhyRefused(bytes), StartsWith("it is not a signature of this manifest ("));
}

TEST_F(SignatureTest, CertificatesWithoutASignatureAreRefused) {
  std::unique_ptr<CMS_ContentInfo, void (*)(CMS_ContentInfo*)> const none(
      CMS_sign(nullptr, nullptr, nullptr, nullptr, CMS_DETACHED | CMS_PARTIAL), CMS_ContentInfo_free);
  unsigned char* bytes = nullptr;
  int const size = i2d_CMS_ContentInfo(none.get(), &bytes);
  ASSERT_GT(size, 0);
  std::string const encoded(reinterpret_cast<char*>(bytes), static_cast<std::size_t>(size));
  OPENSSL_free(bytes);
  EXPECT_EQ(WhyRefused(encoded), "it is not a signature of this manifest (no signers)");
}

TEST_F(SignatureTest, OpenSslVerifiesIt) {
  WriteFile(fDir.Path("text"), "text");
  WriteFile(fDir.Path("text.p7s"), SignedBy(fAlice));
  std::string const verify = "cd '" + fDir.Path() +
                             "' && openssl cms -verify -binary -inform DER -in text.p7s -content text -CAfile ca.pem -out got "
                             "2> errors";
  EXPECT_EQ(std::system(verify.c_str()), 0) << ReadFile(fDir.Path("errors"));
  EXPECT_EQ(ReadFile(fDir.Path("got")), "text");
}

TEST_F(SignatureTest, OneFileMayHaveKeyAndCertificate) {
  WriteFile(fDir.Path("both"), ReadFile(fAlice.fCertificateFile) + ReadFile(fAlice.fKeyFile));
  std::filesystem::permissions(fDir.Path("both"), std::filesystem::perms(0600));
  EXPECT_EQ(VerifierFor({fAlice.fCertificateFile, ""})->Verify("x", SignerFrom(fDir.Path("both"), "")->Sign("x")), "CN=alice");
}

TEST_F(SignatureTest, AnIntermediateCertificateTravelsWithTheSignature) {
  TIdentity const middle(fDir, "middle", 100, &fCa, true), below(fDir, "below", 100, &middle);
  EXPECT_THAT(WhyRefused(SignedBy(below), {"", fCa.fCertificateFile}), HasSubstr("unable to get local issuer certificate"));
  WriteFile(fDir.Path("chain"), ReadFile(below.fCertificateFile) + ReadFile(middle.fCertificateFile));
  std::string const signature = SignerFrom(below.fKeyFile, fDir.Path("chain"))->Sign("text");
  EXPECT_EQ(WhyRefused(signature, {"", fCa.fCertificateFile}), "");
  EXPECT_EQ(WhyRefused(signature, {"", middle.fCertificateFile}), "");
}

TEST_F(SignatureTest, OnlyAnAuthorityIssues) {
  TIdentity const below(fDir, "below", 100, &fAlice);
  EXPECT_THAT(WhyRefused(SignedBy(below), {"", fAlice.fCertificateFile}), HasSubstr("invalid CA certificate"));
}

TEST_F(SignatureTest, AKeyThatCannotBeUsedIsNamed) {
  EXPECT_EQ(WhyNoSigner(fAlice.fKeyFile, fMallory.fCertificateFile),
            fMallory.fCertificateFile + " has a certificate that belongs to another key than that of --sign");
  EXPECT_EQ(WhyNoSigner(fAlice.fKeyFile), fAlice.fKeyFile + " has no certificate in PEM");
  EXPECT_THAT(WhyNoSigner(fAlice.fCertificateFile), StartsWith(fAlice.fCertificateFile + " has no private key in PEM"));
  EXPECT_EQ(WhyNoSigner(fDir.Path("none")), "the file of --sign cannot be read: No such file or directory");
  EXPECT_EQ(WhyNoSigner(fAlice.fKeyFile, fDir.Path("none")),
            "the file of --certificate cannot be read: No such file or directory");
  EXPECT_THAT(WhyNoSigner("/dev/zero"), HasSubstr("it is longer than 1 MiB"));
  fAlice.WriteProtectedKey(fDir.Path("protected"));
  EXPECT_THAT(WhyNoSigner(fDir.Path("protected")),
              StartsWith(fDir.Path("protected") + " has a passphrase, and zep asks for none"));
  WriteFile(fDir.Path("broken"), "-----BEGIN CERTIFICATE-----\nAAAA\n-----END CERTIFICATE-----\n");
  EXPECT_THAT(WhyNoSigner(fAlice.fKeyFile, fDir.Path("broken")), HasSubstr("has a certificate that OpenSSL cannot read: "));
}

TEST_F(SignatureTest, TrustedCertificatesThatCannotBeReadAreNamed) {
  EXPECT_EQ(WhyNoVerifier({fDir.Path("none"), ""}), "the file of --signer cannot be read: No such file or directory");
  EXPECT_EQ(WhyNoVerifier({"", fDir.Path("none")}), "the file of --ca cannot be read: No such file or directory");
  EXPECT_EQ(WhyNoVerifier({"", fAlice.fKeyFile}), fAlice.fKeyFile + " has no certificate in PEM");
  WriteFile(fDir.Path("two"), ReadFile(fAlice.fCertificateFile) + ReadFile(fCa.fCertificateFile));
  EXPECT_EQ(WhyNoVerifier({fDir.Path("two"), ""}), fDir.Path("two") + " has more than one certificate; --ca takes several");
}

TEST_F(SignatureTest, AKeyThatEveryUserMayReadIsReported) {
  std::filesystem::permissions(fAlice.fKeyFile, std::filesystem::perms(0644));
  testing::internal::CaptureStderr();
  SignedBy(fAlice);
  EXPECT_THAT(testing::internal::GetCapturedStderr(), HasSubstr("zep: warning: every user may read the private key in "));
}

}  // namespace
}  // namespace NQRVZEP20::zep
