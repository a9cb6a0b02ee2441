// SPDX-License-Identifier: Apache-2.0
#include "tools/zep/transfer/Sha256.h"

#include <array>
#include <cerrno>
#include <cstdint>
#include <cstdio>
#include <memory>
#include <system_error>

namespace NQRVZEP20::zep {

namespace {

constexpr std::size_t kBlock = 64;

// The first 32 bits behind the point of the cube roots of the first 64 primes (FIPS 180-4).
constexpr std::uint32_t kRounds[64] = {
    0x428a2f98, 0x71374491, 0xb5c0fbcf, 0xe9b5dba5, 0x3956c25b, 0x59f111f1, 0x923f82a4, 0xab1c5ed5, 0xd807aa98, 0x12835b01,
    0x243185be, 0x550c7dc3, 0x72be5d74, 0x80deb1fe, 0x9bdc06a7, 0xc19bf174, 0xe49b69c1, 0xefbe4786, 0x0fc19dc6, 0x240ca1cc,
    0x2de92c6f, 0x4a7484aa, 0x5cb0a9dc, 0x76f988da, 0x983e5152, 0xa831c66d, 0xb00327c8, 0xbf597fc7, 0xc6e00bf3, 0xd5a79147,
    0x06ca6351, 0x14292967, 0x27b70a85, 0x2e1b2138, 0x4d2c6dfc, 0x53380d13, 0x650a7354, 0x766a0abb, 0x81c2c92e, 0x92722c85,
    0xa2bfe8a1, 0xa81a664b, 0xc24b8b70, 0xc76c51a3, 0xd192e819, 0xd6990624, 0xf40e3585, 0x106aa070, 0x19a4c116, 0x1e376c08,
    0x2748774c, 0x34b0bcb5, 0x391c0cb3, 0x4ed8aa4a, 0x5b9cca4f, 0x682e6ff3, 0x748f82ee, 0x78a5636f, 0x84c87814, 0x8cc70208,
    0x90befffa, 0xa4506ceb, 0xbef9a3f7, 0xc67178f2};

std::uint32_t Rotated(std::uint32_t value, int bits) { return value >> bits | value << (32 - bits); }

class TSha256 {
public:
  // Whole blocks only.
  void Add(unsigned char const* bytes, std::size_t size) {
    for (; size > 0; bytes += kBlock, size -= kBlock) AddBlock(bytes);
  }

  std::string Text() const {
    std::string text;
    char digits[9];
    for (std::uint32_t const word : fState) {
      std::snprintf(digits, sizeof digits, "%08x", word);
      text += digits;
    }
    return text;
  }

private:
  void AddBlock(unsigned char const* bytes) {
    std::uint32_t words[64];
    for (int i = 0; i < 16; ++i, bytes += 4)
      words[i] = std::uint32_t{bytes[0]} << 24 | std::uint32_t{bytes[1]} << 16 | std::uint32_t{bytes[2]} << 8 | bytes[3];
    for (int i = 16; i < 64; ++i) {
      std::uint32_t const a = words[i - 15], b = words[i - 2];
      words[i] =
          words[i - 16] + (Rotated(a, 7) ^ Rotated(a, 18) ^ a >> 3) + words[i - 7] + (Rotated(b, 17) ^ Rotated(b, 19) ^ b >> 10);
    }
    auto [a, b, c, d, e, f, g, h] = fState;
    for (int i = 0; i < 64; ++i) {
      std::uint32_t const first =
          h + (Rotated(e, 6) ^ Rotated(e, 11) ^ Rotated(e, 25)) + ((e & f) ^ (~e & g)) + kRounds[i] + words[i];
      std::uint32_t const second = (Rotated(a, 2) ^ Rotated(a, 13) ^ Rotated(a, 22)) + ((a & b) ^ (a & c) ^ (b & c));
      h = g, g = f, f = e, e = d + first, d = c, c = b, b = a, a = first + second;
    }
    std::array<std::uint32_t, 8> const sum = {a, b, c, d, e, f, g, h};
    for (std::size_t i = 0; i < sum.size(); ++i) fState[i] += sum[i];
  }

  std::array<std::uint32_t, 8> fState = {0x6a09e667, 0xbb67ae85, 0x3c6ef372, 0xa54ff53a,
                                         0x510e527f, 0x9b05688c, 0x1f83d9ab, 0x5be0cd19};
};

// A one bit, zeros, and the length of all in bits, behind the last bytes; how many there are then.
std::size_t AddEnd(unsigned char* bytes, std::size_t size, std::uint64_t length) {
  bytes[size++] = 0x80;
  while (size % kBlock != kBlock - 8) bytes[size++] = 0;
  for (int shift = 56; shift >= 0; shift -= 8) bytes[size++] = static_cast<unsigned char>(length * 8 >> shift);
  return size;
}

}  // namespace

std::string Sha256Of(std::string const& file) {
  std::unique_ptr<std::FILE, int (*)(std::FILE*)> const stream(std::fopen(file.c_str(), "rb"), std::fclose);
  if (!stream) throw std::system_error(errno, std::generic_category(), file);
  constexpr std::size_t kChunk = 1024 * kBlock;
  unsigned char bytes[kChunk + 2 * kBlock];
  TSha256 sum;
  std::uint64_t length = 0;
  std::size_t got;
  while ((got = std::fread(bytes, 1, kChunk, stream.get())) == kChunk) {
    sum.Add(bytes, got);
    length += got;
  }
  if (std::ferror(stream.get()) != 0) throw std::system_error(EIO, std::generic_category(), file);
  sum.Add(bytes, AddEnd(bytes, got, length + got));
  return sum.Text();
}

}  // namespace NQRVZEP20::zep
