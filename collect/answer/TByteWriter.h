// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <cstdint>
#include <string>
#include <string_view>
#include <type_traits>

namespace NQRVZEP20 {

// Appends numbers and strings to a buffer. Fixed-width numbers have the byte order of this machine, because the reader runs on
// the same machine.
class TByteWriter {
public:
  void Byte(unsigned int value) { fBytes.push_back(static_cast<char>(value)); }  // its lowest eight bits

  // A variable-length number (LEB128): 7 bits per byte, the lowest first; the highest bit of a byte states whether another byte
  // follows.
  void Number(std::uint64_t value);

  template <class T>
  void Fixed(T value) {
    static_assert(std::is_arithmetic_v<T>);
    fBytes.append(reinterpret_cast<char const*>(&value), sizeof value);
  }

  void Text(std::string_view text);  // its length and its bytes
  void Raw(std::string_view bytes) { fBytes.append(bytes); }

  std::string const& Bytes() const { return fBytes; }
  void Clear() { fBytes.clear(); }
  void CutTo(std::size_t size) { fBytes.resize(size); }  // truncates the buffer

private:
  std::string fBytes;
};

}  // namespace NQRVZEP20
