// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <memory>
#include <string>
#include <string_view>

namespace NQRVZEP20::zep {

// Computes the SHA-256 checksum of bytes that arrive piece by piece, by OpenSSL. Every operation throws std::runtime_error if
// OpenSSL fails.
class TSha256 {
public:
  virtual ~TSha256() = default;

  virtual void Add(std::string_view bytes) = 0;

  // The checksum of all bytes as 64 hexadecimal digits. Call it once, at the end.
  virtual std::string Digits() = 0;
};

std::unique_ptr<TSha256> NewSha256();

}  // namespace NQRVZEP20::zep
