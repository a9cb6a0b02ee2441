// SPDX-License-Identifier: Apache-2.0
#include "tools/zep/packing/Signature.h"

#include "collect/SafeText.h"
#include "tools/zep/output/Failure.h"
#include "tools/zep/packing/OpenSsl.h"

#include <openssl/cms.h>
#include <openssl/err.h>
#include <openssl/pem.h>
#include <openssl/x509.h>
#include <openssl/x509_vfy.h>

#include <climits>
#include <new>
#include <utility>

namespace NQRVZEP20::zep {

namespace {

void FreeList(STACK_OF(X509) * certificates) { sk_X509_free(certificates); }
void FreeCertificates(STACK_OF(X509) * certificates) { sk_X509_pop_free(certificates, X509_free); }

using TBio = TOpenSsl<BIO, BIO_free_all>;
using TKey = TOpenSsl<EVP_PKEY, EVP_PKEY_free>;
using TCertificate = TOpenSsl<X509, X509_free>;
using TCertificates = TOpenSsl<STACK_OF(X509), FreeCertificates>;
using TBorrowed = TOpenSsl<STACK_OF(X509), FreeList>;  // owns none of its certificates
using TStore = TOpenSsl<X509_STORE, X509_STORE_free>;
using TCms = TOpenSsl<CMS_ContentInfo, CMS_ContentInfo_free>;

TBio BioOf(std::string_view bytes) {
  if (bytes.size() > INT_MAX) throw std::bad_alloc();
  char const* const begin = bytes.empty() ? "" : bytes.data();  // OpenSSL accepts no null pointer
  return OrNoMemory(TBio(BIO_new_mem_buf(begin, static_cast<int>(bytes.size()))));
}

[[noreturn]] void Refuse(std::string const& file, std::string const& why) { throw TFailure(kExitNoInput, file + " " + why); }

// Called by OpenSSL in place of a question on the terminal.
int NotePassphrase(char*, int, int, void* isWanted) {
  *static_cast<bool*>(isWanted) = true;
  return -1;
}

TKey ReadKey(TPem const& pem) {
  bool hasPassphrase = false;
  TKey key(PEM_read_bio_PrivateKey(BioOf(pem.fText).get(), nullptr, NotePassphrase, &hasPassphrase));
  if (hasPassphrase)
    Refuse(pem.fFile,
           "has a passphrase, and zep asks for none, so that a report can be signed without a terminal; openssl pkey writes a "
           "copy without one, which only its owner may read");
  if (!key) Refuse(pem.fFile, "has no private key in PEM that OpenSSL can read: " + TakeReason().fText);
  return key;
}

// The certificates in the file, at least one, in their order.
TCertificates ReadCertificates(TPem const& pem) {
  TBio const bio = BioOf(pem.fText);
  auto certificates = OrNoMemory(TCertificates(sk_X509_new_null()));
  while (TCertificate certificate{PEM_read_bio_X509(bio.get(), nullptr, nullptr, nullptr)}) {
    if (sk_X509_push(certificates.get(), certificate.get()) <= 0) throw std::bad_alloc();
    static_cast<void>(certificate.release());
  }
  TReason const reason = TakeReason();  // "no start line" at the end of the file
  bool const isEnd = reason.fLibrary == ERR_LIB_PEM && reason.fCode == PEM_R_NO_START_LINE;
  if (!isEnd) Refuse(pem.fFile, "has a certificate that OpenSSL cannot read: " + reason.fText);
  if (sk_X509_num(certificates.get()) == 0) Refuse(pem.fFile, "has no certificate in PEM");
  return certificates;
}

// Verification refuses certificates of another purpose, or of another time, so they must not sign.
void CheckCertificate(X509* certificate, EVP_PKEY const* key, std::string const& file) {
  if (X509_check_private_key(certificate, key) != 1) {
    ERR_clear_error();
    Refuse(file, "has a certificate that belongs to another key than that of --sign");
  }
  if (X509_cmp_current_time(X509_get0_notAfter(certificate)) < 0) Refuse(file, "has a certificate that has expired");
  if (X509_cmp_current_time(X509_get0_notBefore(certificate)) > 0) Refuse(file, "has a certificate that is not valid yet");
  if (X509_check_purpose(certificate, X509_PURPOSE_SMIME_SIGN, 0) != 1)
    Refuse(file,
           "has a certificate that is not for signatures: its key usage lacks digitalSignature, or its extended key usage lacks "
           "emailProtection");
}

// Certificates are trusted as they are, also those that others issued.
TStore StoreOf(STACK_OF(X509) const* certificates) {
  auto store = OrNoMemory(TStore(X509_STORE_new()));
  for (int at = 0; at < sk_X509_num(certificates); ++at)
    if (X509_STORE_add_cert(store.get(), sk_X509_value(certificates, at)) != 1) throw std::bad_alloc();
  X509_STORE_set_flags(store.get(), X509_V_FLAG_PARTIAL_CHAIN);
  return store;
}

std::string TextIn(BIO* memory) {
  char* text = nullptr;
  long const size = BIO_get_mem_data(memory, &text);
  return {text, static_cast<std::size_t>(size)};
}

std::string SubjectOf(X509 const* certificate) {
  auto const text = OrNoMemory(TBio(BIO_new(BIO_s_mem())));
  X509_NAME_print_ex(text.get(), X509_get_subject_name(certificate), 0, XN_FLAG_RFC2253 & ~ASN1_STRFLGS_ESC_MSB);
  return TextIn(text.get());
}

std::string SubjectsOf(CMS_ContentInfo* cms) {
  TBorrowed const signers(CMS_get0_signers(cms));
  std::string subjects;
  for (int at = 0; at < sk_X509_num(signers.get()); ++at)
    subjects += (at == 0 ? "" : " and ") + SubjectOf(sk_X509_value(signers.get(), at));
  return Shortened(subjects, 1000);
}

[[noreturn]] void ThrowRefused() {
  TReason const reason = TakeReason();
  if (reason.fLibrary == ERR_LIB_CMS && reason.fCode == CMS_R_SIGNER_CERTIFICATE_NOT_FOUND)
    throw TSignatureError("it is of another signer than the one that is trusted");
  if (reason.fLibrary == ERR_LIB_CMS && reason.fCode == CMS_R_CERTIFICATE_VERIFY_ERROR)
    throw TSignatureError("the certificate of its signer is not trusted (" + Printable(reason.fData) + ")");
  throw TSignatureError("it is not a signature of this manifest (" + Printable(reason.fText) + ")");
}

// ---- Signing ----

class TCmsSigner : public TSigner {
public:
  TCmsSigner(TPem const& key, TPem const& certificates)
      : fKey(ReadKey(key)), fOthers(ReadCertificates(certificates)), fCertificate(sk_X509_shift(fOthers.get())) {
    CheckCertificate(fCertificate.get(), fKey.get(), certificates.fFile);
    try {
      SignatureOf("");
    } catch (std::runtime_error const& failure) {
      Refuse(key.fFile, std::string("has a key that cannot sign; RSA and ECDSA keys can (") + failure.what() + ")");
    }
  }

  std::string Sign(std::string const& text) const override { return SignatureOf(text); }

private:
  std::string SignatureOf(std::string const& text) const {
    TBio const content = BioOf(text);
    unsigned const flags = CMS_DETACHED | CMS_BINARY | CMS_NOSMIMECAP;
    TCms const cms(CMS_sign(fCertificate.get(), fKey.get(), fOthers.get(), content.get(), flags));
    auto const signature = OrNoMemory(TBio(BIO_new(BIO_s_mem())));
    if (!cms || i2d_CMS_bio(signature.get(), cms.get()) != 1) ThrowOpenSslFailure();
    return TextIn(signature.get());
  }

  TKey const fKey;
  TCertificates const fOthers;
  TCertificate const fCertificate;
};

// ---- Verifying ----

class TCmsVerifier : public TVerifier {
public:
  TCmsVerifier(ETrusted trusted, TPem const& pem) {
    if (trusted == ETrusted::kAnyone) return;
    TCertificates certificates = ReadCertificates(pem);
    fTrusted = StoreOf(certificates.get());
    if (trusted == ETrusted::kAuthorities) return;
    if (sk_X509_num(certificates.get()) != 1) Refuse(pem.fFile, "has more than one certificate; --ca takes several");
    fSigner = std::move(certificates);
  }

  std::string Verify(std::string const& text, std::string const& signature) const override {
    TBio const encoded = BioOf(signature), content = BioOf(text);
    TCms const cms(d2i_CMS_bio(encoded.get(), nullptr));
    if (!cms) ThrowRefused();
    if (BIO_pending(encoded.get()) != 0) throw TSignatureError("it has bytes after its end");
    unsigned flags = CMS_DETACHED | CMS_BINARY;
    if (fSigner) flags |= CMS_NOINTERN;
    if (!fTrusted) flags |= CMS_NO_SIGNER_CERT_VERIFY;
    if (CMS_verify(cms.get(), fSigner.get(), fTrusted.get(), content.get(), nullptr, flags) != 1) ThrowRefused();
    return SubjectsOf(cms.get());
  }

private:
  TCertificates fSigner;  // null if the signature may be of another one
  TStore fTrusted;        // null if the certificate is not checked
};

}  // namespace

std::unique_ptr<TSigner> NewSigner(TPem const& key, TPem const& certificates) {
  return std::make_unique<TCmsSigner>(key, certificates);
}

std::unique_ptr<TVerifier> NewVerifier(ETrusted trusted, TPem const& certificates) {
  return std::make_unique<TCmsVerifier>(trusted, certificates);
}

}  // namespace NQRVZEP20::zep
