// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <memory>
#include <string>
#include <string_view>

struct gcry_md_handle;

namespace NQRVZEP20::zep {

// Computes the SHA-256 checksum of bytes that arrive piece by piece. The constructor throws std::runtime_error if libgcrypt does
// not provide SHA-256.
class TSha256 {
public:
  TSha256();

  void Add(std::string_view bytes);

  // The checksum of all bytes as 64 hexadecimal digits. Nothing can be added afterwards.
  std::string Digits() const;

private:
  std::unique_ptr<gcry_md_handle, void (*)(gcry_md_handle*)> fHash;
};

// The SHA-256 checksum of a file as 64 hexadecimal digits. An interrupt (Interrupts.h) ends the computation; the result is then
// empty. Throws std::system_error if the file cannot be read, and like TSha256.
std::string Sha256Of(std::string const& file);

// The same of a text.
std::string Sha256OfText(std::string const& text);

}  // namespace NQRVZEP20::zep
