// SPDX-License-Identifier: Apache-2.0
#include "tools/zep/bundle/Signature.h"

#include "collect/SafeText.h"
#include "tools/zep/output/Failure.h"
#include "tools/zep/secrets/PrivateFile.h"

#include <openssl/cms.h>
#include <openssl/err.h>
#include <openssl/pem.h>
#include <openssl/x509.h>
#include <openssl/x509_vfy.h>

#include <climits>
#include <new>
#include <string_view>
#include <utility>

namespace NQRVZEP20::zep {

namespace {

void FreeList(STACK_OF(X509) * certificates) { sk_X509_free(certificates); }
void FreeCertificates(STACK_OF(X509) * certificates) { sk_X509_pop_free(certificates, X509_free); }

template <auto kFree>
struct TFreer {
  template <class T>
  void operator()(T* object) const noexcept {
    kFree(object);
  }
};
using TBio = std::unique_ptr<BIO, TFreer<BIO_free_all>>;
using TKey = std::unique_ptr<EVP_PKEY, TFreer<EVP_PKEY_free>>;
using TCertificate = std::unique_ptr<X509, TFreer<X509_free>>;
using TCertificates = std::unique_ptr<STACK_OF(X509), TFreer<FreeCertificates>>;
using TBorrowed = std::unique_ptr<STACK_OF(X509), TFreer<FreeList>>;  // owns none of its certificates
using TStore = std::unique_ptr<X509_STORE, TFreer<X509_STORE_free>>;
using TCms = std::unique_ptr<CMS_ContentInfo, TFreer<CMS_ContentInfo_free>>;

// Where OpenSSL returns no object because there is no memory.
template <class TOwner>
TOwner OrNoMemory(TOwner owner) {
  if (!owner) throw std::bad_alloc();
  return owner;
}

// The first reason why OpenSSL failed; the list of reasons is empty afterwards.
struct TReason {
  int fLibrary, fCode;
  std::string fText, fData;
};

TReason TakeReason() {
  char const* data = nullptr;
  int flags = 0;
  unsigned long const first = ERR_peek_error();
  ERR_peek_last_error_all(nullptr, nullptr, nullptr, &data, &flags);
  char const* const text = ERR_reason_error_string(first);
  bool const hasData = data != nullptr && (flags & ERR_TXT_STRING) != 0;
  TReason reason{ERR_GET_LIB(first), ERR_GET_REASON(first), text != nullptr ? text : "unknown error", hasData ? data : ""};
  ERR_clear_error();
  if (reason.fCode == ERR_R_MALLOC_FAILURE) throw std::bad_alloc();
  return reason;
}

TBio BioOf(std::string_view bytes) {
  if (bytes.size() > INT_MAX) throw std::bad_alloc();
  char const* const begin = bytes.empty() ? "" : bytes.data();  // OpenSSL accepts no null pointer
  return OrNoMemory(TBio(BIO_new_mem_buf(begin, static_cast<int>(bytes.size()))));
}

[[noreturn]] void Refuse(std::string const& name, std::string const& why) { throw TFailure(kExitNoInput, name + " " + why); }

TPrivateFile Contents(std::string const& file, std::string const& option) {
  TPrivateFile contents(file);
  if (contents.Error() != 0) Refuse(NameOfPrivateFile(file, option), "cannot be read: " + contents.Reason());
  return contents;
}

// Called by OpenSSL in place of a question on the terminal.
int NotePassphrase(char*, int, int, void* isWanted) {
  *static_cast<bool*>(isWanted) = true;
  return -1;
}

TKey ReadKey(std::string const& file) {
  TPrivateFile const contents = Contents(file, "--sign");
  contents.WarnWhenOthersMayRead("the private key");
  bool hasPassphrase = false;
  TKey key(PEM_read_bio_PrivateKey(BioOf(contents.Text()).get(), nullptr, NotePassphrase, &hasPassphrase));
  if (hasPassphrase)
    Refuse(file,
           "has a passphrase, and zep asks for none, so that a report can be signed without a terminal; openssl pkey writes a "
           "copy without one, which only its owner may read");
  if (!key) Refuse(file, "has no private key in PEM that OpenSSL can read: " + TakeReason().fText);
  return key;
}

// The certificates in the file, at least one, in their order.
TCertificates ReadCertificates(std::string const& file, std::string const& option) {
  TPrivateFile const contents = Contents(file, option);
  TBio const bio = BioOf(contents.Text());
  auto certificates = OrNoMemory(TCertificates(sk_X509_new_null()));
  while (TCertificate certificate{PEM_read_bio_X509(bio.get(), nullptr, nullptr, nullptr)}) {
    if (sk_X509_push(certificates.get(), certificate.get()) <= 0) throw std::bad_alloc();
    static_cast<void>(certificate.release());
  }
  TReason const reason = TakeReason();  // "no start line" at the end of the file
  bool const isEnd = reason.fLibrary == ERR_LIB_PEM && reason.fCode == PEM_R_NO_START_LINE;
  if (!isEnd) Refuse(file, "has a certificate that OpenSSL cannot read: " + reason.fText);
  if (sk_X509_num(certificates.get()) == 0) Refuse(file, "has no certificate in PEM");
  return certificates;
}

void CheckCertificate(X509 const* certificate, EVP_PKEY const* key, std::string const& file) {
  if (X509_check_private_key(certificate, key) != 1) {
    ERR_clear_error();
    Refuse(file, "has a certificate that belongs to another key than that of --sign");
  }
  if (X509_cmp_current_time(X509_get0_notAfter(certificate)) < 0) Refuse(file, "has a certificate that has expired");
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

}  // namespace

// ---- Signing ----

struct TSigner::TParts {
  TKey fKey;
  TCertificate fCertificate;
  TCertificates fOthers;
};

TSigner::TSigner(std::string const& keyFile, std::string const& certificateFile) : fParts(std::make_unique<TParts>()) {
  fParts->fKey = ReadKey(keyFile);
  bool const isOneFile = certificateFile.empty();
  std::string const& file = isOneFile ? keyFile : certificateFile;
  fParts->fOthers = ReadCertificates(file, isOneFile ? "--sign" : "--certificate");
  fParts->fCertificate.reset(sk_X509_shift(fParts->fOthers.get()));
  CheckCertificate(fParts->fCertificate.get(), fParts->fKey.get(), file);
  try {
    Sign("");
  } catch (std::runtime_error const& failure) {
    Refuse(keyFile, std::string("has a key that cannot sign: ") + failure.what());
  }
}

TSigner::~TSigner() = default;

std::string TSigner::Sign(std::string const& text) const {
  TBio const content = BioOf(text);
  unsigned const flags = CMS_DETACHED | CMS_BINARY | CMS_NOSMIMECAP;
  TCms const cms(CMS_sign(fParts->fCertificate.get(), fParts->fKey.get(), fParts->fOthers.get(), content.get(), flags));
  auto const signature = OrNoMemory(TBio(BIO_new(BIO_s_mem())));
  if (!cms || i2d_CMS_bio(signature.get(), cms.get()) != 1) throw std::runtime_error("OpenSSL: " + TakeReason().fText);
  return TextIn(signature.get());
}

// ---- Verifying ----

struct TVerifier::TParts {
  TCertificates fSigner;  // null if the signature may be of another one
  TStore fTrusted;        // null if the certificate is not checked
};

TVerifier::TVerifier(TTrust const& trust) : fParts(std::make_unique<TParts>()) {
  if (!trust.IsWanted()) return;
  bool const isSigner = !trust.fSignerFile.empty();
  auto certificates = ReadCertificates(isSigner ? trust.fSignerFile : trust.fAuthoritiesFile, isSigner ? "--signer" : "--ca");
  fParts->fTrusted = StoreOf(certificates.get());
  if (!isSigner) return;
  if (sk_X509_num(certificates.get()) != 1) Refuse(trust.fSignerFile, "has more than one certificate; --ca takes several");
  fParts->fSigner = std::move(certificates);
}

TVerifier::~TVerifier() = default;

std::string TVerifier::Verify(std::string const& text, std::string const& signature) const {
  TBio const encoded = BioOf(signature), content = BioOf(text);
  TCms const cms(d2i_CMS_bio(encoded.get(), nullptr));
  if (!cms) ThrowRefused();
  unsigned flags = CMS_DETACHED | CMS_BINARY;
  if (fParts->fSigner) flags |= CMS_NOINTERN;
  if (!fParts->fTrusted) flags |= CMS_NO_SIGNER_CERT_VERIFY;
  if (CMS_verify(cms.get(), fParts->fSigner.get(), fParts->fTrusted.get(), content.get(), nullptr, flags) != 1) ThrowRefused();
  return SubjectsOf(cms.get());
}

}  // namespace NQRVZEP20::zep
