// SPDX-License-Identifier: Apache-2.0
#include "tools/zep/transfer/Sha256.h"

#include "tools/zep/processes/Interrupts.h"

#include <gcrypt.h>

#include <cerrno>
#include <cstdio>
#include <memory>
#include <stdexcept>
#include <system_error>
#include <vector>

namespace NQRVZEP20::zep {

namespace {

// libgcrypt must be initialised before its first use. It needs no locked memory for checksums.
bool InitialiseLibrary() {
  if (gcry_check_version(GCRYPT_VERSION) == nullptr) return false;
  gcry_control(GCRYCTL_DISABLE_SECMEM, 0);
  gcry_control(GCRYCTL_INITIALIZATION_FINISHED, 0);
  return true;
}

gcry_md_hd_t NewHash() {
  static bool const isInitialised = InitialiseLibrary();
  if (!isInitialised) throw std::runtime_error("libgcrypt is older than " GCRYPT_VERSION);
  gcry_md_hd_t hash = nullptr;
  gcry_error_t const error = gcry_md_open(&hash, GCRY_MD_SHA256, 0);
  if (error != 0) throw std::runtime_error(std::string("libgcrypt: ") + gcry_strerror(error));
  return hash;
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

}  // namespace

TSha256::TSha256() : fHash(NewHash(), gcry_md_close) {}

void TSha256::Add(std::string_view bytes) { gcry_md_write(fHash.get(), bytes.data(), bytes.size()); }

std::string TSha256::Digits() const {
  return DigitsOf(gcry_md_read(fHash.get(), GCRY_MD_SHA256), gcry_md_get_algo_dlen(GCRY_MD_SHA256));
}

std::string Sha256Of(std::string const& file) {
  std::unique_ptr<std::FILE, int (*)(std::FILE*)> const stream(std::fopen(file.c_str(), "rb"), std::fclose);
  if (!stream) throw std::system_error(errno, std::generic_category(), file);
  TSha256 sum;
  std::vector<char> chunk(65536);
  while (std::size_t const got = std::fread(chunk.data(), 1, chunk.size(), stream.get())) {
    if (PendingInterrupt() != 0) return "";
    sum.Add({chunk.data(), got});
  }
  if (PendingInterrupt() != 0) return "";
  if (std::ferror(stream.get()) != 0) throw std::system_error(EIO, std::generic_category(), file);
  return sum.Digits();
}

std::string Sha256OfText(std::string const& text) {
  TSha256 sum;
  sum.Add(text);
  return sum.Digits();
}

}  // namespace NQRVZEP20::zep
