// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <cstddef>
#include <cstdint>
#include <string_view>

namespace NQRVZEP20 {

// Bytes that a controller sent; numbers in them have their lowest byte first. Bytes beyond the end read as 0, so that a parser
// checks a length only where it matters. Refers to the bytes.
class TBytes {
public:
  explicit TBytes(std::string_view bytes) : fBytes(bytes) {}

  std::size_t Size() const { return fBytes.size(); }
  std::uint8_t At(std::size_t offset) const { return offset < fBytes.size() ? static_cast<std::uint8_t>(fBytes[offset]) : 0; }
  std::uint16_t Word(std::size_t offset) const { return static_cast<std::uint16_t>(At(offset) | At(offset + 1) << 8); }
  std::uint32_t Long(std::size_t offset) const { return Word(offset) | static_cast<std::uint32_t>(Word(offset + 2)) << 16; }

  // At most `length` bytes; fewer at the end.
  std::string_view Part(std::size_t offset, std::size_t length) const {
    return offset < fBytes.size() ? fBytes.substr(offset, length) : std::string_view();
  }

private:
  std::string_view fBytes;
};

}  // namespace NQRVZEP20
