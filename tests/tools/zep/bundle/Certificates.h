// SPDX-License-Identifier: Apache-2.0
#pragma once

// Keys and certificates for tests, made by OpenSSL's library.

#include "tests/Support.h"

#include <openssl/ec.h>
#include <openssl/pem.h>
#include <openssl/x509v3.h>

#include <cstdio>
#include <filesystem>
#include <memory>
#include <stdexcept>
#include <string>

namespace NQRVZEP20::zep {

// A key with its certificate, in the files NAME.key and NAME.pem of a directory.
class TIdentity {
public:
  // The certificate is valid for `days` from yesterday on. It is issued by itself, or by `issuer`, and may issue others if
  // `isAuthority`.
  TIdentity(TTempDir const& dir, std::string const& name, int days = 100, TIdentity const* issuer = nullptr,
            bool isAuthority = false)
      : fKeyFile(dir.Path(name + ".key")), fCertificateFile(dir.Path(name + ".pem")), fKey(EVP_EC_gen("P-256"), EVP_PKEY_free) {
    X509* const certificate = fCertificate.get();
    X509_set_version(certificate, X509_VERSION_3);
    ASN1_INTEGER_set(X509_get_serialNumber(certificate), ++gSerial);
    X509_gmtime_adj(X509_getm_notBefore(certificate), -86400);
    X509_gmtime_adj(X509_getm_notAfter(certificate), 86400L * (days - 1));
    X509_set_pubkey(certificate, fKey.get());
    X509_NAME_add_entry_by_txt(X509_get_subject_name(certificate), "CN", MBSTRING_UTF8,
                               reinterpret_cast<unsigned char const*>(name.c_str()), -1, -1, 0);
    X509 const* const above = issuer != nullptr ? issuer->fCertificate.get() : certificate;
    X509_set_issuer_name(certificate, X509_get_subject_name(above));
    if (isAuthority) Extend(NID_basic_constraints, "critical,CA:TRUE");
    Write(fKeyFile, [&](std::FILE* file) { PEM_write_PrivateKey(file, fKey.get(), nullptr, nullptr, 0, nullptr, nullptr); });
    Sign(issuer != nullptr ? issuer->fKey.get() : fKey.get());
  }

  std::string const fKeyFile, fCertificateFile;

  // Change a certificate that is issued by itself.
  void RestrictTo(int extension, char const* value) {
    Extend(extension, value);
    Sign(fKey.get());
  }
  void BeginTomorrow() {
    X509_gmtime_adj(X509_getm_notBefore(fCertificate.get()), 86400);
    Sign(fKey.get());
  }

  // Writes the key to another file, with a passphrase.
  void WriteProtectedKey(std::string const& name) const {
    Write(name, [&](std::FILE* file) {
      PEM_write_PKCS8PrivateKey(file, fKey.get(), EVP_aes_128_cbc(), "secret", 6, nullptr, nullptr);
    });
  }

private:
  static inline long gSerial = 0;

  template <class TUse>
  static void Write(std::string const& name, TUse use) {
    std::unique_ptr<std::FILE, int (*)(std::FILE*)> const file(std::fopen(name.c_str(), "w"), std::fclose);
    if (!file) throw std::runtime_error(name + " cannot be written");
    use(file.get());
    std::filesystem::permissions(name, std::filesystem::perms::owner_read | std::filesystem::perms::owner_write);
  }

  void Sign(EVP_PKEY* key) {
    if (X509_sign(fCertificate.get(), key, EVP_sha256()) == 0) throw std::runtime_error("a certificate cannot be signed");
    Write(fCertificateFile, [&](std::FILE* file) { PEM_write_X509(file, fCertificate.get()); });
  }

  void Extend(int extension, char const* value) {
    std::unique_ptr<X509_EXTENSION, void (*)(X509_EXTENSION*)> const made(X509V3_EXT_conf_nid(nullptr, nullptr, extension, value),
                                                                          X509_EXTENSION_free);
    X509_add_ext(fCertificate.get(), made.get(), -1);
  }

  std::unique_ptr<EVP_PKEY, void (*)(EVP_PKEY*)> fKey;
  std::unique_ptr<X509, void (*)(X509*)> fCertificate{X509_new(), X509_free};
};

}  // namespace NQRVZEP20::zep
