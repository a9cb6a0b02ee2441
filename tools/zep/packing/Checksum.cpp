// SPDX-License-Identifier: Apache-2.0
#include "tools/zep/packing/Checksum.h"

#include "tools/zep/packing/OpenSsl.h"

#include <openssl/evp.h>

#include <cstddef>

namespace NQRVZEP20::zep {

namespace {

void Check(int result) {
  if (result != 1) ThrowOpenSslFailure();
}

std::string DigitsOf(unsigned char const* bytes, std::size_t size) {
  constexpr char kDigits[] = "0123456789abcdef";
  std::string text;
  for (std::size_t i = 0; i < size; ++i) {
    text += kDigits[bytes[i] >> 4];
    text += kDigits[bytes[i] & 15];
  }
  return text;
}

class TEvpSha256 : public TSha256 {
public:
  TEvpSha256() { Check(EVP_DigestInit_ex(fContext.get(), EVP_sha256(), nullptr)); }

  void Add(std::string_view bytes) override { Check(EVP_DigestUpdate(fContext.get(), bytes.data(), bytes.size())); }

  std::string Digits() override {
    unsigned char bytes[EVP_MAX_MD_SIZE];
    unsigned int size = 0;
    Check(EVP_DigestFinal_ex(fContext.get(), bytes, &size));
    return DigitsOf(bytes, size);
  }

private:
  using TContext = TOpenSsl<EVP_MD_CTX, EVP_MD_CTX_free>;

  TContext const fContext = OrNoMemory(TContext(EVP_MD_CTX_new()));
};

}  // namespace

std::unique_ptr<TSha256> NewSha256() { return std::make_unique<TEvpSha256>(); }

}  // namespace NQRVZEP20::zep
